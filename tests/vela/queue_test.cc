// Requests over a queue itself.
#include "tests/vela/transport.h"
#include "vela/MsgQueue.h"

namespace {

using vela::CompDesc_t;
using vela::Msg;
using vela::MsgQueue;

constexpr unsigned int soon = 20;  // ms

const CompDesc_t Ccs(1, 1, 1, 0x15, 0);

class QueueTest : public TransportTest {
  protected:
    QueueTest() { queue_->attach(); }
    ~QueueTest() override { queue_->detach(); }

    static std::unique_ptr<Msg> command() {
        auto msg = std::make_unique<Msg>(0U);
        msg->setMsgType(8);
        msg->setTrans(1001);
        msg->setTgtAddr(Ccs);
        return msg;
    }

    ScriptedBoard board_;
    MsgQueue* queue_ = std::make_unique<MsgQueue>(Ccs, 512, 5).release();
};

TEST_F(QueueTest, ReturnsTheExpectedReplyToTheCaller) {
    board_.answers(8, 9, {1, 2});
    const std::unique_ptr<Msg> reply(queue_->request(command().release(), 5000, 9));
    ASSERT_NE(reply, nullptr);
    EXPECT_EQ(reply->getMsgType(), 9U);
    EXPECT_EQ(octetsOf(*reply), (Octets{1, 2}));
}

TEST_F(QueueTest, ReturnsNothingWhereNothingWasExpectedAndNothingCame) {
    EXPECT_EQ(queue_->request(command().release(), soon, 0), nullptr);
    EXPECT_EQ(queue_->request(command().release(), 0, 0), nullptr);
}

TEST_F(QueueTest, ItsTimeoutPrintsTypeAndTimeWithAnUnbalancedParenthesis) {
    try {
        queue_->request(command().release(), soon, 19);
        FAIL() << "nothing was thrown";
    } catch (const MsgQueue::Timeout& timeout) {
        EXPECT_EQ(printed(timeout), "MsgQueue::Timeout MsgType: 0x13 Timeout: 20ms)");
        EXPECT_EQ(timeout.queue(), queue_);
        std::ostringstream out;
        out << std::oct << timeout << " " << 8;
        EXPECT_EQ(out.str(), "MsgQueue::Timeout MsgType: 0x13 Timeout: 20ms) 10");
    }
}

TEST_F(QueueTest, ItsErrorPrintsTheMessageThatCame) {
    board_.answers(8, 0, {9});
    try {
        queue_->request(command().release(), 5000, 9);
        FAIL() << "nothing was thrown";
    } catch (const MsgQueue::ErrorMsg& error) {
        EXPECT_EQ(
            printed(error),
            "MsgQueue::ErrorMsg MsgBody: {MsgType: 0 Source: {Node 0 Board 0x1 Processor 0x1 Component 0x15 "
            "Instance 0x1} Target: {Node 0x6 Board 0x9 Processor 0x8 Component 0x7 Instance 0x1001} "
            "Size: 1 Trans: 1001 Body: {ByteData {0x9 }}}");
        EXPECT_EQ(error.queue(), queue_);
        EXPECT_EQ(error.msg()->getMsgType(), 0U);
    }
}

}  // namespace
