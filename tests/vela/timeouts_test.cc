// How long objects wait, and where their two time-outs come from.
#include "tests/vela/transport.h"
#include "vela/Board.h"
#include "vela/CCS.h"
#include "vela/TSCComponent.h"

namespace {

using vela::Addressable;
using vela::CompDesc_t;
using vela::StdResource;

constexpr std::uint32_t compFind = 8388669, componentResult = 8388615, compInstAllocate = 8388670;
constexpr std::uint32_t clusterFind = 8388691, clusterResult = 8388652, clusterCompByAttr = 8388638;
constexpr std::uint32_t compUse = 8388697, resultComplete = 8388608;

const CompDesc_t Ccs(1, 1, 1, 0x15, 0);
const Octets foundAddress{2, 0, 3, 1, 0x15, 0};

using Pair = std::pair<unsigned int, unsigned int>;

// Response time-out and error wait time, in ms.
Pair timeoutsOf(const Addressable& object) {
    return {object.getResponseTimeout(), object.getErrorWaitTime()};
}

void setTimeouts(Addressable& object, unsigned int responseMs, unsigned int errorWaitMs) {
    object.setResponseTimeout(responseMs);
    object.setErrorWaitTime(errorWaitMs);
}

class TimeoutsTest : public TransportTest {
  protected:
    TimeoutsTest() {
        script_.answers(compFind, componentResult, foundAddress);
        script_.answers(compInstAllocate, componentResult, foundAddress);
        script_.answers(clusterFind, clusterResult, foundAddress);
        script_.answers(clusterCompByAttr, componentResult, foundAddress);
        script_.answers(compUse, resultComplete);
    }

    ScriptedBoard script_;
    vela::Board board_{3, nullptr};
};

TEST_F(TimeoutsTest, AreFiveSecondsForAReplyAndOneForAnErrorUnlessSet) {
    EXPECT_EQ(timeoutsOf(board_), Pair(5000, 1000));
    EXPECT_EQ(timeoutsOf(board_.resourceMgr()), Pair(5000, 1000));
    EXPECT_EQ(timeoutsOf(StdResource(Ccs, board_.getMsgQueue())), Pair(5000, 1000));
}

TEST_F(TimeoutsTest, ACopyTakesBothAsTheyAreThenAndKeepsThem) {
    vela::CCS ccs(Ccs, board_.getMsgQueue());
    setTimeouts(ccs, 1001, 1002);
    const Addressable addressable(ccs), pointed(&ccs);
    const StdResource resource(static_cast<const Addressable&>(ccs)), copied(resource);
    const vela::Component component(resource), copiedComponent(component);
    const vela::TSCComponent tsc(component);
    const vela::Instance instance(resource), copiedInstance(instance);
    const vela::TmpInstance temporary(resource), copiedTemporary(temporary);
    const vela::Instance fromTemporary(temporary, 0);
    const vela::CCS copiedCcs(ccs);
    const vela::Cluster cluster(static_cast<const Addressable&>(ccs)), copiedCluster(cluster);
    setTimeouts(ccs, 1, 2);
    for (const Addressable* copy : std::initializer_list<const Addressable*>{
             &addressable, &pointed, &resource, &copied, &component, &copiedComponent, &tsc, &instance,
             &copiedInstance, &temporary, &copiedTemporary, &fromTemporary, &copiedCcs, &cluster,
             &copiedCluster})
        EXPECT_EQ(timeoutsOf(*copy), Pair(1001, 1002)) << typeid(*copy).name();
}

TEST_F(TimeoutsTest, AnInstanceMadeOfATemporaryOneReservesWithItsTimeout) {
    script_.script(compUse, [](const fake_norv::Message&) {});
    vela::TmpInstance temporary(Ccs, board_.getMsgQueue());
    temporary.setResponseTimeout(20);
    try {
        const vela::Instance reserved(temporary, 1);
        FAIL() << "nothing was thrown";
    } catch (const Addressable::Timeout& timeout) {
        EXPECT_EQ(timeout.timeoutMs(), 20U);
    }
}

TEST_F(TimeoutsTest, AManagerTakesBothFromTheObjectItIsMadeFor) {
    StdResource object(Ccs, board_.getMsgQueue());
    setTimeouts(object, 1001, 1002);
    EXPECT_EQ(timeoutsOf(vela::ResourceMgr(object)), Pair(1001, 1002));
    EXPECT_EQ(timeoutsOf(vela::ClusterMgr(&object)), Pair(1001, 1002));
}

TEST_F(TimeoutsTest, ThoseOfABoardReachSearchesMadeAfterwards) {
    script_.script(compFind, [](const fake_norv::Message&) {});
    static_cast<Addressable&>(board_).setResponseTimeout(20);
    for (int i = 0; i < 2; ++i) {
        try {
            board_.findComp(0x15, 1);
            ADD_FAILURE() << "nothing was thrown";
        } catch (const Addressable::Timeout& timeout) {
            EXPECT_EQ(timeout.timeoutMs(), 20U);
        }
        board_.MsgQueueAttach(nullptr);  // the managers are made again
    }
    setTimeouts(board_, 1001, 1002);
    EXPECT_EQ(timeoutsOf(board_.resourceMgr()), Pair(1001, 1002));
    EXPECT_EQ(timeoutsOf(board_.clusterMgr()), Pair(1001, 1002));
}

TEST_F(TimeoutsTest, WhatIsFoundHasThoseOfTheBoardThenAndKeepsThem) {
    setTimeouts(board_, 1001, 1002);
    const vela::Component component = board_.findComp(0x15, 1);
    const vela::Instance instance = board_.findInst(0x15, 1, 2);
    const vela::StdResource allocated = board_.resourceMgr().allocate(0x15, 1, Ccs, {});
    vela::staticList<vela::CompAttr_t> none;
    const vela::Cluster cluster = board_.clusterMgr().find(Ccs, none);
    const vela::StdResource member = board_.clusterMgr().componentByAttr(Ccs, 0x15, none);
    setTimeouts(board_, 1, 2);
    for (const Addressable* found :
         std::initializer_list<const Addressable*>{&component, &instance, &allocated, &cluster, &member})
        EXPECT_EQ(timeoutsOf(*found), Pair(1001, 1002)) << typeid(*found).name();
}

}  // namespace
