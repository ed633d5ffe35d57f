// Tests which receiver gets an unasked message, and what happens to it if there is no receiver.
#include <atomic>

#include "tests/hostsvc/msg_queue.h"

namespace {

using fake_norv::Op;
using testing::ElementsAre;

using KSMsgQueueReceiversTest = KSMsgQueueTest;

TEST_F(KSMsgQueueReceiversTest, TheReceiverGetsWhatNobodyWaitsFor) {
    receive();
    event(1001);
    event(1002);
    ASSERT_TRUE(receiver_.waitFor(2));
    EXPECT_THAT(receiver_.types(), ElementsAre(1001, 1002));
}

std::atomic<unsigned> plainCalls{0};

int notePlain(KSMsgRef& msg) {
    plainCalls += msg.getMsgType();
    return 0;
}

int takePlain(KSMsgRef& msg) {
    plainCalls += msg.getMsgType();
    msg.free();
    return 0;
}

TEST_F(KSMsgQueueReceiversTest, APlainCallbackIsCalledBesideTheReceiver) {
    plainCalls = 0;
    receive();
    queue_->registerAsyncCallback(notePlain);
    event(1001);
    ASSERT_TRUE(receiver_.waitFor(1));
    EXPECT_EQ(plainCalls, 1001U);
}

TEST_F(KSMsgQueueReceiversTest, APlainCallbackAloneOwnsTheMessage) {
    plainCalls = 0;
    queue_->registerAsyncCallback(takePlain);
    event(1001);
    while (plainCalls == 0)
        std::this_thread::yield();
    EXPECT_EQ(plainCalls, 1001U);
}

TEST_F(KSMsgQueueReceiversTest, AReceiverReplacesThePlainCallbackAndTheReceiverBefore) {
    plainCalls = 0;
    Receiver other;
    queue_->registerAsyncCallback(static_cast<KSAsyncMsgReceiver*>(&other), receiverMember);
    queue_->registerAsyncCallback(notePlain);
    receive();
    event(1001);
    ASSERT_TRUE(receiver_.waitFor(1));
    EXPECT_EQ(plainCalls, 0U);
    EXPECT_THAT(other.types(), ElementsAre());
}

TEST_F(KSMsgQueueReceiversTest, WithoutReceiverMessagesAreParkedOneAtATime) {
    event(1001);
    event(1002);
    event(1003);
    EXPECT_EQ(queue_->read(), 1001U);
    EXPECT_EQ(queue_->read(), 1002U);
    EXPECT_EQ(queue_->read(), 1003U);
}

TEST_F(KSMsgQueueReceiversTest, AReceiverThatComesLaterGetsTheParkedMessageAndTheOneThatWaitsForItsPlace) {
    event(1001);
    event(1002);
    ASSERT_TRUE(fake_norv::waitForCalls(Op::read, 2));  // the first is parked, the second waits
    receive();
    ASSERT_TRUE(receiver_.waitFor(2));
    EXPECT_THAT(receiver_.types(), ElementsAre(1001, 1002));
}

TEST_F(KSMsgQueueReceiversTest, AParkedMessageReachesTheReceiverBeforeTheRegistrationReturns) {
    event(1001);
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    receive();
    EXPECT_THAT(receiver_.types(), ElementsAre(1001));
    event(1002);
    ASSERT_TRUE(receiver_.waitFor(2));
    EXPECT_THAT(receiver_.types(), ElementsAre(1001, 1002));
}

TEST_F(KSMsgQueueReceiversTest, AParkedMessageReachesAPlainCallbackToo) {
    plainCalls = 0;
    event(1001);
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    queue_->registerAsyncCallback(takePlain);
    EXPECT_EQ(plainCalls, 1001U);
}

}  // namespace
