// Waiting for one message or event.
#include <optional>
#include <utility>

#include "tests/support/test_system.h"
#include "tests/vela/events.h"

namespace {

using vela::Addressable;
using vela::EvtCallback;
using vela::Msg;
using vela::StdResource;

class WaiterTest : public EventTest {
  protected:
    WaiterTest() {
        system_->insteadOfNapping = [this, waiting = std::this_thread::get_id()] {
            if (std::this_thread::get_id() == waiting && action_)
                std::exchange(action_, nullptr)();
            std::this_thread::yield();
        };
    }
    // Lets time pass again while the queue is closed, because its reader does not sleep while it reads.
    ~WaiterTest() override {
        EXPECT_TRUE(fake_norv::waitForIdleReader());
        system_.reset();
        end();
    }

    // Once, when this thread sleeps between two tries.
    void whenAsleep(std::function<void()> action) { action_ = std::move(action); }

    std::function<void()> action_;  // this thread's
    std::optional<SleeplessSystem> system_{std::in_place};
};

// Milliseconds: ten million naps, each of which takes no time but lets other threads run.
constexpr unsigned int longWait = 100'000'000;

TEST_F(WaiterTest, Waiting25MillisecondsTriesThreeTimesAndGivesUp) {
    const auto waiter = ccs_->getNewMsgWait(replyType);
    try {
        waiter->wait(nullptr, 25);
        FAIL() << "nothing was thrown";
    } catch (const EvtCallback::MsgWait::Timeout& timeout) {
        EXPECT_EQ(timeout.type(), replyType);
        EXPECT_EQ(timeout.timeoutMs(), 25U);
        EXPECT_EQ(printed(timeout), "EvtCallback::MsgWait::Timeout Type: 0x13 Timeout: 25ms");
    }
    EXPECT_THAT(system_->naps(), testing::ElementsAre(10000, 10000));
}

TEST_F(WaiterTest, AnEventThatDoesNotComeIsATimeoutToo) {
    try {
        ccs_->asyncWaitEvtGroup(2, nullptr, 25);
        FAIL() << "nothing was thrown";
    } catch (const EvtCallback::EvtWait::Timeout& timeout) {
        EXPECT_EQ(printed(timeout), "EvtCallback::EvtWait::Timeout Type: 0x2 Timeout: 25ms");
    }
}

TEST_F(WaiterTest, TheMessageIsReadIntoTheBody) {
    whenAsleep([&] { EXPECT_TRUE(sendReply()); });
    StdResource::MsgGetParmCmplt_t reply;
    ccs_->asyncWaitMsg(replyType, &reply, longWait);
    EXPECT_EQ(reply.Val, 1001U);
}

TEST_F(WaiterTest, AnEventThatArrivesIsReadIntoTheBody) {
    whenAsleep([&] { EXPECT_TRUE(sendTrace()); });
    vela::CCS::EvtL2Trace_t trace;
    ccs_->asyncWaitEvtGroup(2, &trace, longWait);
    EXPECT_EQ(trace.Timestamp, 1003U);
}

TEST_F(WaiterTest, TheMessageItselfIsTheCallers) {
    whenAsleep([&] { EXPECT_TRUE(sendReply()); });
    const std::unique_ptr<Msg> msg(ccs_->asyncWaitMsgMsg(replyType, longWait));
    EXPECT_EQ(msg->getMsgType(), replyType);
    ccs_->asyncRegisterMsgType(1001, &recorder_, &Recorder::onMsg, 0);  // a dispatcher for what comes between
    whenAsleep([&] { EXPECT_TRUE(sendTrace()); });
    const std::unique_ptr<Msg> event(ccs_->asyncWaitEvtGroupMsg(2, longWait));
    EXPECT_EQ(event->getMsgType(), 32U);
}

TEST_F(WaiterTest, AMessageThatCameBeforeTheWaitIsReturnedAtOnce) {
    const auto waiter = ccs_->getNewEvtWait(2);
    ASSERT_TRUE(sendTrace());
    const std::unique_ptr<Msg> msg(waiter->waitMsg(0));
    EXPECT_EQ(msg->getSize(), 17U);
}

TEST_F(WaiterTest, AWaiterTriggersOnce) {
    const auto waiter = ccs_->getNewMsgWait(replyType);
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendReply());
    waiter->wait(nullptr, 0);
    ASSERT_TRUE(sendReply());
    EXPECT_THAT(recorder_.texts(1), testing::ElementsAre("message 19 12 octets"));
    EXPECT_THROW(waiter->wait(nullptr, 25), EvtCallback::MsgWait::Timeout);
}

TEST_F(WaiterTest, AWaiterMayBeEnabledAgain) {
    const auto waiter = ccs_->getNewMsgWait(1001);
    waiter->enable(replyType);
    ASSERT_TRUE(sendReply());
    waiter->enable(replyType);
    ASSERT_TRUE(sendReply());
    waiter->wait(nullptr, 0);
    waiter->enable(replyType);
    EXPECT_THROW(waiter->wait(nullptr, 25), EvtCallback::MsgWait::Timeout);
}

TEST_F(WaiterTest, OneThatTimedOutMayGoOnWaiting) {
    const auto waiter = ccs_->getNewMsgWait(replyType);
    EXPECT_THROW(waiter->wait(nullptr, 25), EvtCallback::MsgWait::Timeout);
    ASSERT_TRUE(sendReply());
    EXPECT_NO_THROW(waiter->wait(nullptr, 0));
}

TEST_F(WaiterTest, WaitingWithoutEnablingTimesOut) {
    EvtCallback dispatcher(ccs_.get());
    EvtCallback::MsgWait waiter(&dispatcher);
    EXPECT_THROW(waiter.wait(nullptr, 25), EvtCallback::MsgWait::Timeout);
    EXPECT_NO_THROW(waiter.disable());
    EXPECT_THROW(waiter.waitMsg(25), EvtCallback::MsgWait::Timeout);
}

TEST_F(WaiterTest, MadeWithATimeItWaitsAtOnce) {
    EvtCallback dispatcher(ccs_.get());
    EXPECT_THROW(EvtCallback::MsgWait(&dispatcher, replyType, 25), EvtCallback::MsgWait::Timeout);
    EXPECT_THROW(EvtCallback::EvtWait(&dispatcher, 2, 25), EvtCallback::EvtWait::Timeout);
    whenAsleep([&] { EXPECT_TRUE(sendReply()); });
    EXPECT_NO_THROW(EvtCallback::MsgWait(&dispatcher, replyType, longWait));
}

TEST_F(WaiterTest, MadeWithATimeOutItReturnsTheMessageThatCame) {
    EvtCallback dispatcher(ccs_.get());
    whenAsleep([&] { EXPECT_TRUE(sendReply()); });
    EvtCallback::MsgWait returned(&dispatcher, replyType, longWait);
    const std::unique_ptr<Msg> msg(returned.waitMsg(25));
    EXPECT_EQ(msg->getMsgType(), replyType);
    EXPECT_THROW(returned.waitMsg(25), EvtCallback::MsgWait::Timeout) << "once";
    whenAsleep([&] { EXPECT_TRUE(sendTrace()); });
    EvtCallback::EvtWait read(&dispatcher, 2, longWait);
    vela::CCS::EvtL2Trace_t trace;
    read.wait(&trace, 25);
    EXPECT_EQ(trace.Timestamp, 1003U);
}

TEST_F(WaiterTest, MadeWithATimeOutAndNotAskedAgainItDropsTheMessage) {
    EvtCallback dispatcher(ccs_.get());
    dispatcher.unregisteredMsgType(vela::Handler(&recorder_, &Recorder::onMsg), onDispatcher);
    whenAsleep([&] { EXPECT_TRUE(sendReply()); });
    { const EvtCallback::MsgWait waiter(&dispatcher, replyType, longWait); }
    EXPECT_EQ(recorder_.entries(0).size(), 0U) << "somebody had waited for it";
}

TEST_F(WaiterTest, OfMessagesThatComeTogetherItTakesTheOneThatArrivedFirst) {
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, onDispatcher);
    for (int i = 0; i < 200; ++i) {
        const auto waiter = ccs_->getNewMsgWait(replyType);
        for (const std::uint32_t value : {1U, 2U, 3U}) {
            ASSERT_TRUE(fake_norv::deliver({1, replyType, ccs_->getTgtDesc().getNvCompDesc(),
                                            host().getNvCompDesc(), fake_norv::words({7, value, 0})}));
        }
        ASSERT_TRUE(fake_norv::waitForIdleReader());
        StdResource::MsgGetParmCmplt_t reply;
        waiter->wait(&reply, 0);
        ASSERT_EQ(reply.Val, 1U);
        EXPECT_EQ(recorder_.entries(2).size(), 2U) << "the others are nobody's";
        recorder_.clear();
    }
}

TEST_F(WaiterTest, AMessageThatComesAtTheTimeOutGoesToTheNextWaitOrToTheUnregisteredHandler) {
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, 0);
    auto waiter = ccs_->getNewMsgWait(replyType);
    EXPECT_THROW(waiter->wait(nullptr, 25), EvtCallback::MsgWait::Timeout);
    ASSERT_TRUE(sendReply());
    waiter->wait(nullptr, 0);
    waiter->enable(replyType);
    EXPECT_THROW(waiter->wait(nullptr, 25), EvtCallback::MsgWait::Timeout);
    ASSERT_TRUE(sendReply());
    waiter.reset();
    EXPECT_THAT(recorder_.texts(1), testing::ElementsAre("message 19 12 octets"));
}

TEST_F(WaiterTest, EnabledAgainItPassesOnAMessageThatNobodyWaitedFor) {
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, 0);
    const auto waiter = ccs_->getNewMsgWait(replyType);
    ASSERT_TRUE(sendReply());
    waiter->enable(replyType);
    EXPECT_THAT(recorder_.texts(1), testing::ElementsAre("message 19 12 octets"));
}

TEST_F(WaiterTest, ADisabledOneIsRegisteredNoMore) {
    const auto waiter = ccs_->getNewMsgWait(replyType);
    waiter->disable();
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, 0);
    ASSERT_TRUE(sendReply());
    EXPECT_EQ(recorder_.entries(1).size(), 1U);
}

TEST_F(WaiterTest, CancelledBySomebodyElseItIsDestroyedQuietly) {
    auto waiter = ccs_->getNewMsgWait(replyType);
    ccs_->asyncCancelMsgType(replyType);
    EXPECT_THROW(waiter->wait(nullptr, 25), EvtCallback::MsgWait::Timeout);
    EXPECT_NO_THROW(waiter.reset());
}

TEST_F(WaiterTest, DestroyedAsItsMessageArrivesItLeavesNothingBehind) {
    ccs_->asyncUnregisteredMsgType(&recorder_, &Recorder::onMsg, 0);
    for (int i = 0; i < 50; ++i) {
        const auto waiter = ccs_->getNewMsgWait(replyType);
        ASSERT_TRUE(fake_norv::deliver(
            {1, replyType, ccs_->getTgtDesc().getNvCompDesc(), host().getNvCompDesc(), {}}));
    }
}

TEST_F(WaiterTest, SeveralWaitersOfOneTypeEachGetIt) {
    const auto first = ccs_->getNewMsgWait(replyType);
    const auto second = ccs_->getNewMsgWait(replyType);
    ASSERT_TRUE(sendReply());
    EXPECT_NO_THROW(first->wait(nullptr, 0));
    EXPECT_NO_THROW(second->wait(nullptr, 0));
}

}  // namespace
