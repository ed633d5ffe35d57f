// Tests how deliveries get their threads: a limited number at a time, the others in order of arrival, and
// which are lost.
#include <atomic>
#include <functional>
#include <set>

#include "tests/support/test_system.h"
#include "tests/vela/lanes.h"

namespace {

using namespace lanes;  // NOLINT(google-build-using-namespace): the words of these tests
using testing::ElementsAre;

TEST_F(LaneTest, ALimitedNumberIsAtWorkAndTheOthersFollowInOrder) {
    traceInto({.atWork = 3});
    sendTraces(0, 10);
    EXPECT_EQ(slow_.given(3).size(), 3U);
    EXPECT_EQ(lane_->waiting(), 7U);
    for (unsigned int ended = 1; ended <= 7; ++ended) {
        slow_.letEnd(1);
        const auto given = slow_.given(3 + ended);
        EXPECT_EQ(given.back().timestamp, 2 + ended) << "the oldest that waited came next";
        EXPECT_EQ(lane_->waiting(), 7U - ended);
    }
    EXPECT_EQ(slow_.most(), 3U);
    std::set<std::thread::id> atOnce;
    for (const Slow::Given& each : slow_.given(3))
        atOnce.insert(each.thread);
    EXPECT_GE(atOnce.size(), 3U);
    EXPECT_EQ(atOnce.count(std::this_thread::get_id()), 0U);
}

TEST_F(LaneTest, AboutAHundredAreAtWorkUnlessSomebodySaysOtherwise) {
    traceInto(Lane::Bounds());
    sendTraces(0, 130);
    EXPECT_EQ(slow_.given(100).size(), 100U);
    EXPECT_EQ(lane_->waiting(), 30U);
    EXPECT_EQ(Lane::Bounds().waiting, 1000000U);
    EXPECT_EQ(Lane::Bounds().octets, 512U << 20);
}

TEST_F(LaneTest, DeliveriesAreNumberedInTheOrderOfArrival) {
    traceInto({.atWork = 2});
    sendTraces(0, 50);
    slow_.letEnd(all);
    unsigned int number = 0;
    for (const Slow::Given& each : slow_.given(50)) {
        EXPECT_EQ(each.arrival.number, ++number);
        EXPECT_EQ(each.arrival.missing, 0U);
    }
    EXPECT_EQ(lane_->started(), 50U);
}

TEST_F(LaneTest, ABodyThatCameAnotherWayHasNoNumber) {
    const CCS::EvtL2Trace_t own;
    EXPECT_EQ(own.arrival().number, 0U);
}

TEST_F(LaneTest, CallbacksOnTheDispatchingThreadAreNumberedToo) {
    ccs_->asyncRegisterEvtGroup(group, vela::Handler(&slow_, &Slow::onTrace), onDispatcher);
    slow_.letEnd(2);
    sendTraces(0, 2);
    EXPECT_EQ(slow_.given(2)[0].arrival.number, 1U);
    EXPECT_EQ(slow_.given(2)[1].arrival.number, 2U);
}

TEST_F(LaneTest, TheNewestAreLostWhenTooManyWaitAndTheNextOneSaysHowMany) {
    traceInto({.atWork = 2, .waiting = 3});
    sendTraces(0, 9);  // 0 and 1 at work, 2 to 4 wait, 5 to 8 are lost
    EXPECT_EQ(lane_->losses().noRoom, 4U);
    EXPECT_EQ(lane_->losses().noMeans, 0U);
    EXPECT_EQ(lane_->missing(), 4U);
    slow_.letEnd(1);
    slow_.given(3);
    sendTraces(9, 1);
    EXPECT_EQ(lane_->missing(), 0U);
    slow_.letEnd(all);
    const auto given = slow_.given(6);
    for (unsigned int i = 0; i < 6; ++i) {
        EXPECT_EQ(given[i].timestamp, i < 5 ? i : 9);
        EXPECT_EQ(given[i].arrival.number, i + 1);
        EXPECT_EQ(given[i].arrival.missing, i < 5 ? 0U : 4U);
    }
    EXPECT_EQ(said(), "too many deliveries waited, lost: 4\n");
}

TEST_F(LaneTest, TheyMayTakeSoMuchMemory) {
    constexpr unsigned int octets = 1000;
    traceInto({.atWork = 1, .octets = 5 * octets});
    sendTraces(0, 9, octets);
    EXPECT_EQ(lane_->waiting(), 3U) << "each takes its octets and some more";
    EXPECT_EQ(lane_->losses().noRoom, 5U);
    slow_.letEnd(all);
    slow_.given(4);
    sendTraces(9, 3, octets);
    EXPECT_EQ(slow_.given(7).size(), 7U) << "the room was given back";
}

TEST_F(LaneTest, OneThatNeedNotWaitNeedsNoRoom) {
    traceInto({.atWork = 1, .waiting = 0});
    for (unsigned int i = 0; i < 5; ++i) {
        sendTraces(i, 1);
        slow_.letEnd(1);
        slow_.given(i + 1);
        ccs_->asyncCancelEvtGroup(group);
        traceInto({.atWork = 1, .waiting = 0});  // that one may not have ended yet
    }
    EXPECT_EQ(slow_.given(5).size(), 5U);
}

TEST_F(LaneTest, OneThatTheSystemRefusesAThreadIsLostAndTheNextOneSaysSo) {
    traceInto({.atWork = 5});
    sendTraces(0, 1);
    {
        const ThreadlessSystem none;
        sendTraces(1, 3);
    }
    sendTraces(4, 1);
    const auto given = slow_.given(2);
    EXPECT_EQ(given[1].timestamp, 4U);
    EXPECT_EQ(given[1].arrival.number, 2U);
    EXPECT_EQ(given[1].arrival.missing, 3U);
    EXPECT_EQ(lane_->losses().noMeans, 3U);
}

TEST_F(LaneTest, WaitingDeliveriesAreKeptWhenThreadsAreRefusedWhileSomeAreAtWork) {
    traceInto({.atWork = 2});
    sendTraces(0, 6);
    slow_.given(2);
    {
        const ThreadlessSystem none;
        slow_.letEnd(1);
        while (lane_->losses().noMeans == 0)
            std::this_thread::yield();
    }
    EXPECT_EQ(lane_->waiting(), 3U) << "one was refused, the others wait for the end of the next one";
    slow_.letEnd(all);
    const auto given = slow_.given(5);
    EXPECT_EQ(given[2].timestamp, 3U);
    EXPECT_EQ(given[2].arrival.number, 3U);
    EXPECT_EQ(given[2].arrival.missing, 1U);
    EXPECT_EQ(said(), "(EvtCallback_Class214) vela internal error\nvela::Thread::CreationError\n");
}

TEST_F(LaneTest, NothingWaitsForEverWhenThreadsAreRefusedAndNothingIsAtWork) {
    traceInto({.atWork = 1});
    sendTraces(0, 4);
    slow_.given(1);
    const ThreadlessSystem none;
    slow_.letEnd(1);
    while (lane_->losses().noMeans < 3)
        std::this_thread::yield();
    EXPECT_EQ(lane_->waiting(), 0U);
    EXPECT_EQ(lane_->missing(), 3U);
}

TEST_F(LaneTest, ADeliveryWhoseBodyCannotBeMadeIsLostAndTheNextOneSaysSo) {
    class NoBodyFor7 : public CCS {
      public:
        using CCS::CCS;
        ~NoBodyFor7() override { endCallbacks(); }
        MsgBody* EvtBodyLookup(unsigned int evtType) override {
            if (fails.exchange(false))
                throw std::bad_alloc();
            return CCS::EvtBodyLookup(evtType);
        }
        std::atomic<bool> fails{false};
    };
    auto failing = std::make_unique<NoBodyFor7>(ccs_->getTgtDesc(), nullptr);
    NoBodyFor7& object = *failing;
    ccs_ = std::move(failing);
    traceInto({.atWork = 5});
    sendTraces(0, 1);
    object.fails = true;
    sendTraces(1, 2);
    const auto given = slow_.given(2);
    EXPECT_EQ(given[1].timestamp, 2U);
    EXPECT_EQ(given[1].arrival.missing, 1U);
    EXPECT_EQ(lane_->losses().noMeans, 1U);
    slow_.letEnd(all);
    EXPECT_EQ(said(), "(EvtCallback_Class219) vela internal error\n");
}

// ---- Who does not wait.

TEST_F(LaneTest, RepliesRegistrationsAndOtherCallbacksDoNotWaitForASlowOne) {
    board_.answers(8, 9);
    traceInto({.atWork = 2});
    sendTraces(0, 500);
    slow_.given(2);
    ccs_->SetParm(10, 1, nullptr);
    ccs_->asyncRegisterMsgType(replyType, &recorder_, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), ElementsAre("message 19 12 octets"));
    ccs_->asyncCancelMsgType(replyType);
    ccs_->asyncCancelEvtGroup(group);
    EXPECT_EQ(lane_->waiting(), 498U) << "what arrived before the end of the registration is still delivered";
    slow_.letEnd(all);
    EXPECT_EQ(slow_.given(500).size(), 500U);
}

TEST_F(LaneTest, EachRegistrationHasItsOwn) {
    traceInto({.atWork = 1});
    ccs_->asyncRegisterEvtGroup(group, &recorder_, &Recorder::onBody, 0);
    sendTraces(0, 300);
    EXPECT_EQ(recorder_.entries(300).size(), 300U);
    EXPECT_EQ(lane_->waiting(), 299U);
}

TEST_F(LaneTest, AWaiterGetsItsMessageWhileDeliveriesWait) {
    traceInto({.atWork = 1});
    sendTraces(0, 300);
    const auto waiter = ccs_->getNewEvtWait(group);
    sendTraces(300, 2);
    const std::unique_ptr<Msg> msg(waiter->waitMsg(0));
    CCS::EvtL2Trace_t trace;
    msg->read(&trace, 0);
    EXPECT_EQ(trace.Timestamp, 300U);
}

}  // namespace
