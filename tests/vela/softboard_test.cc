// The object layer on the software board, which has its own reading of the wire.
#include <gtest/gtest.h>

#include "softboard/softboard.h"
#include "tests/vela/events.h"
#include "vela/Board.h"
#include "vela/TSCComponent.h"

namespace {

using vela::CCS;
using vela::CompDesc_t;
using vela::StdResource;

softboard::Scenario twoChannels() {
    softboard::Scenario scenario = softboard::oneChannel({{true, 0, {0, 1, 0x7F}}, {false, 5, {0, 1, 0x73}}});
    scenario.channels.front().protocol = softboard::ni2;
    scenario.channels.push_back(scenario.channels.front());
    scenario.channels.back().number = 2;
    return scenario;
}

class SoftboardTest : public testing::Test {
  protected:
    SoftboardTest() {
        softboard::reset(twoChannels());
        board_ = std::make_unique<vela::Board>(1, nullptr);
    }
    ~SoftboardTest() override {
        board_.reset();
        EXPECT_EQ(softboard::balance(), "buffers outstanding 0, queues open 0");
    }

    std::unique_ptr<vela::Board> board_;
};

TEST_F(SoftboardTest, FindsWhatIsOnTheBoard) {
    EXPECT_EQ(board_->findComp(0x12, 1).getTgtDesc(), CompDesc_t(0, 1, 1, 0x12, 0));
    EXPECT_EQ(board_->findInst(0x15, 0xFF, 2).getTgtDesc(), CompDesc_t(2, 1, 1, 0x15, 0));
    EXPECT_THROW(board_->findInst(0x15, 0xFF, 3), vela::Addressable::UnexpectedMsg);
    const auto found = board_->resourceMgr().findAll();
    ASSERT_EQ(found.length(), 3U);
    EXPECT_EQ(found[2].compDesc.value(), CompDesc_t(2, 1, 1, 0x15, 0));
    EXPECT_EQ(board_->resourceMgr().findAll(0x12).length(), 1U);
    EXPECT_EQ(printed(board_->resourceMgr().attributes(found[2].compDesc, 10, 0)), "{{key 0 value 21}}");
}

TEST_F(SoftboardTest, FindsMoreThanAReplyHolds) {
    softboard::Scenario scenario = twoChannels();
    while (scenario.channels.size() < 20) {
        scenario.channels.push_back(scenario.channels.front());
        scenario.channels.back().number = static_cast<uint16_t>(scenario.channels.size());
    }
    softboard::reset(scenario);
    const auto found = board_->resourceMgr().findAll();
    ASSERT_EQ(found.length(), 21U);
    for (unsigned int i = 1; i < 21; ++i)
        EXPECT_EQ(found[i].compDesc->Instance, i);
}

TEST_F(SoftboardTest, SetsAndGetsParameters) {
    CCS ccs(CompDesc_t(2, 1, 1, 0x15, 0), board_->getMsgQueue());
    CCS::MsgGetParmCmplt_t reply;
    ccs.GetParm(7, &reply);
    EXPECT_EQ(reply.Val, 12U);
    ccs.SetParm(10, 1, nullptr);
    ccs.GetParm(10, &reply);
    EXPECT_EQ(reply.Val, 1U);
    try {
        ccs.SetParm(1001, 1, nullptr);
        FAIL() << "nothing was thrown";
    } catch (const vela::Addressable::UnexpectedMsg& unexpected) {
        CCS::MsgError_t error;
        unexpected.msg()->read(&error, 0);
        EXPECT_EQ(printed(error), "{ErrorMsg 8 ErrorCode 2 Data {Num 1001 Val 1}}");
    }
}

TEST_F(SoftboardTest, AnInstanceIsReservedAndGivenBack) {
    softboard::clearJournal();
    { const vela::Instance instance(CompDesc_t(1, 1, 1, 0x15, 0), board_->getMsgQueue(), 1); }
    { const vela::TmpInstance temporary(CompDesc_t(1, 1, 1, 0x15, 0), board_->getMsgQueue()); }
    EXPECT_EQ(softboard::heard(),
              "8388697 {Count 1 List 0100010115"
              "00"
              "00000000}\n8388698 {Count 1 List 010001011500}\n");
}

TEST_F(SoftboardTest, FramesArriveInOrderOnTheDispatchingThread) {
    Recorder recorder;
    CCS ccs(CompDesc_t(1, 1, 1, 0x15, 0), nullptr);
    ccs.asyncRegisterEvtGroup(2, &recorder, &Recorder::onBody, vela::EvtCallback::onDispatchingThread);
    ccs.DetectEvt(2, 0, nullptr);
    ccs.SetParm(10, 1, nullptr);
    EXPECT_THAT(
        recorder.texts(2),
        testing::ElementsAre(
            std::string("body 32 {Label 2 Direction 1 Timestamp 0 Length 3 List {") + '\0' + " \x01 \x7F}}",
            std::string("body 32 {Label 2 Direction 0 Timestamp 5 Length 3 List {") + '\0' + " \x01 \x73}}"));
    ccs.CancelEvt(2, nullptr);
    ccs.SetParm(10, 0, nullptr);
}

TEST_F(SoftboardTest, AWaiterTakesTheFirstFrame) {
    CCS ccs(CompDesc_t(1, 1, 1, 0x15, 0), nullptr);
    ccs.asyncUnregisteredEvtGroup([](vela::Addressable*, vela::Msg* msg) { delete msg; }, 0);
    const auto waiter = ccs.getNewEvtWait(2);
    ccs.DetectEvt(2, 0, nullptr);
    ccs.SetParm(10, 1, nullptr);
    CCS::EvtL2Trace_t trace;
    waiter->wait(&trace, 20000);
    EXPECT_EQ(trace.Timestamp, 0U);
    EXPECT_EQ(trace.List->length(), 3U);
    ccs.CancelEvt(2, nullptr);
    ccs.SetParm(10, 0, nullptr);
}

TEST_F(SoftboardTest, ABoardThatIsNotThereIsATimeout) {
    vela::Board other(2, nullptr);
    other.resourceMgr().setResponseTimeout(20);
    EXPECT_THROW(other.findComp(0x12, 1), vela::Addressable::Timeout);
}

}  // namespace
