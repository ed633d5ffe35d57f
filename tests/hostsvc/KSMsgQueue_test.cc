#include "hostsvc/KSMsgQueue.h"

#include <sched.h>

#include <atomic>
#include <deque>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "hostsvc/KSMsgRef.h"
#include "tests/hostsvc/msg_queue.h"
#include "tests/support/test_system.h"

// The two halves of a request by themselves: a requester that gives up at the last moment.
struct KSMsgQueueProbe {
    static void expect(KSMsgQueue& queue, unsigned transaction, unsigned type, NvCompDesc source) {
        queue.expect({transaction, type, source, false});
    }
    static void giveUp(KSMsgQueue& queue) { queue.giveUp(); }
    static bool waiting(KSMsgQueue& queue) {
        const std::lock_guard lock(queue.guard_);
        return queue.waiting_;
    }
};

namespace {

using fake_norv::Message;
using fake_norv::Op;
using testing::ElementsAre;

TEST_F(KSMsgQueueTest, ARequestIsSentUnderTheQueuesAddressAndReturnsItsReply) {
    answers({{0, replyType, boardAddress, {}, {}}});
    EXPECT_EQ(ask(soon), replyType);
    const Message sent = fake_norv::written().at(0);
    EXPECT_TRUE(descComp(sent.source, queue_->getHostDesc()));
    EXPECT_TRUE(descComp(sent.target, boardAddress));
    EXPECT_EQ(sent.transaction, 10000U);
    EXPECT_EQ(sent.type, commandType);
}

TEST_F(KSMsgQueueTest, RepliesOfTheGeneralTypeAndOfTypeZeroAnswerAnyRequest) {
    answers({{0, 8388609, boardAddress, {}, {}}});
    EXPECT_EQ(ask(soon), 0x800001U);
    answers({{0, 0, boardAddress, {}, {}}});
    EXPECT_EQ(ask(soon), 0U);
}

TEST_F(KSMsgQueueTest, AMessageOfAnotherTypeOrTransactionIsNoReply) {
    receive();
    answers({{0, replyType + 1, boardAddress, {}, {}},
             {10001, replyType, boardAddress, {}, {}},
             {0, replyType, boardAddress, {}, {}}});
    EXPECT_EQ(ask(soon), replyType);
    EXPECT_THAT(receiver_.types(), ElementsAre(replyType + 1, replyType));
}

TEST_F(KSMsgQueueTest, AReplyFromAnotherSourceCountsOnlyWhenAnySourceMayAnswer) {
    receive();
    answers({{0, replyType, otherAddress, {}, {}}});
    EXPECT_EQ(ask(soon, 1), replyType);
    EXPECT_THAT(receiver_.types(), ElementsAre());
    {
        SleeplessSystem system;
        EXPECT_EQ(ask(50), std::nullopt);
    }
    ASSERT_TRUE(receiver_.waitFor(1));
    EXPECT_THAT(receiver_.types(), ElementsAre(replyType));
}

TEST_F(KSMsgQueueTest, ARequestWithoutTimeoutReturnsAFreshEmptyMessage) {
    receive();
    answers({{0, replyType, boardAddress, {}, {1, 2, 3}}});
    KSMsgRef msg = command();
    KSMsgRef back = queue_->request(msg, 0, replyType, 0);
    EXPECT_EQ(back.getSize(), 0U);
    EXPECT_NE(back.getMsgType(), replyType);
    back.free();
    ASSERT_TRUE(receiver_.waitFor(1));
    EXPECT_THAT(receiver_.types(), ElementsAre(replyType));
}

TEST_F(KSMsgQueueTest, ARequestWithoutTimeoutAndWithoutMemoryThrowsOnceItIsSent) {
    KSMsgRef msg = command();
    fake_norv::fail(Op::allocate);
    EXPECT_THROW(queue_->request(msg, 0, replyType, 0), KSMsgRef::AllocationError);
    EXPECT_EQ(fake_norv::written().size(), 1U);
}

TEST_F(KSMsgQueueTest, ARequestThatNobodyAnswersPollsEveryTenMillisecondsAndReturnsNothing) {
    SleeplessSystem system;
    EXPECT_EQ(ask(50), std::nullopt);
    EXPECT_THAT(system.naps(), ElementsAre(10000, 10000, 10000, 10000, 10000));
}

TEST_F(KSMsgQueueTest, ARequestThatTheTransportLosesTimesOut) {
    SleeplessSystem system;
    fake_norv::fail(Op::write);
    EXPECT_EQ(ask(20), std::nullopt);
}

TEST_F(KSMsgQueueTest, AReplyThatComesLateGoesToTheReceiver) {
    receive();
    {
        SleeplessSystem system;
        EXPECT_EQ(ask(10), std::nullopt);
    }
    fake_norv::deliver(fake_norv::replyTo(fake_norv::written().at(0), replyType));
    ASSERT_TRUE(receiver_.waitFor(1));
    EXPECT_THAT(receiver_.types(), ElementsAre(replyType));
    answers({{0, replyType, boardAddress, {}, {}}});
    EXPECT_EQ(ask(soon, 0, 10001), replyType);
}

// The reply of transaction 10000 has reached the slot just when its requester gave up.
void leaveReplyBehind(KSMsgQueue& queue) {
    KSMsgQueueProbe::expect(queue, 10000, replyType, boardAddress);
    fake_norv::deliver({10000, replyType, boardAddress, queue.getHostDesc(), {}});
    while (KSMsgQueueProbe::waiting(queue))
        std::this_thread::yield();
    KSMsgQueueProbe::giveUp(queue);
}

TEST_F(KSMsgQueueTest, AReplyGivenUpAtTheLastMomentGoesToTheReceiverDuringTheNextRequest) {
    receive();
    leaveReplyBehind(*queue_);
    answers({{0, 0x800001, boardAddress, {}, {}}});
    EXPECT_EQ(ask(soon, 0, 10001), 0x800001U);
    EXPECT_THAT(receiver_.types(), ElementsAre(replyType));
}

TEST_F(KSMsgQueueTest, AReplyGivenUpAtTheLastMomentIsParkedWhereThereIsNoReceiver) {
    leaveReplyBehind(*queue_);
    answers({{0, 0x800001, boardAddress, {}, {}}});
    EXPECT_EQ(ask(soon, 0, 10001), 0x800001U);
    EXPECT_EQ(queue_->read(), replyType);
}

TEST_F(KSMsgQueueTest, AReplyThatNobodyTookIsFreedWithTheQueue) {
    leaveReplyBehind(*queue_);
    EXPECT_EQ(fake_norv::outstanding(), 1U);
    queue_.reset();
    EXPECT_EQ(fake_norv::outstanding(), 0U);
}

TEST_F(KSMsgQueueTest, ARequestWithoutTimeoutDoesNotDisturbOneThatWaits) {
    bool nested = false;
    fake_norv::onWrite([&](const Message& heard) {
        if (heard.transaction == 10000) {
            KSMsgRef other = command(20000);
            KSMsgRef back = queue_->request(other, 0, 0, 0);
            nested = true;
            back.free();
            fake_norv::deliver(fake_norv::replyTo(heard, replyType));
        }
    });
    EXPECT_EQ(ask(soon), replyType);
    EXPECT_TRUE(nested);
}

TEST_F(KSMsgQueueTest, DestructionFreesTheParkedMessageAndTheOneThatWaitsForItsPlace) {
    event(1001);
    event(1002);
    event(1003);
    ASSERT_TRUE(fake_norv::waitForCalls(Op::read, 2));
    queue_.reset();
    EXPECT_EQ(fake_norv::outstanding(), 0U);
}

TEST_F(KSMsgQueueTest, DestructionWakesTheReaderAndClosesTheTransportsQueue) {
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    queue_.reset();
    EXPECT_THAT(fake_norv::texts(), ElementsAre("nvQueueOpen()", "nvQueueBind(100)", "nvMsgAllocate(0)",
                                                "nvMsgWrite(100, type 0x0)", "nvMsgFree()",
                                                "nvQueueUnbind(100, 0x1001)", "nvQueueClose(100)"));
}

TEST_F(KSMsgQueueTest, DestructionWithoutMemoryForTheWakeUpEndsTheReaderAllTheSame) {
    SleeplessSystem system;
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    fake_norv::fail(Op::allocate, 2);
    queue_.reset();
    EXPECT_EQ(fake_norv::openQueues(), 0U);
    EXPECT_EQ(fake_norv::written().size(), 0U);
}

TEST_F(KSMsgQueueTest, DestructionWhileMessagesArriveLeavesNoneBehind) {
    receive();
    for (int round = 0; round < 50; ++round) {
        std::atomic<bool> stop{false};
        const NvCompDesc host = queue_->getHostDesc();
        std::thread board([&] {
            while (!stop)
                fake_norv::deliver({0, 1001, boardAddress, host, {1, 2, 3}});
        });
        ASSERT_TRUE(receiver_.waitFor(receiver_.types().size() + 1));
        queue_.reset();
        stop = true;
        board.join();
        EXPECT_EQ(fake_norv::outstanding(), 0U);
        queue_.emplace(NvCompDesc{}, 512, 5, nullptr);
        receive();
    }
}

TEST_F(KSMsgQueueTest, QueuesComeAndGo) {
    for (int round = 0; round < 100; ++round) {
        queue_.reset();
        queue_.emplace(NvCompDesc{}, 512, 5, nullptr);
    }
}

TEST_F(KSMsgQueueTest, AReadThatFailsIsAWakeUpAndNoMore) {
    receive();
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    fake_norv::fail(Op::read, 3);
    event(1001);  // ends the read that is under way
    ASSERT_TRUE(receiver_.waitFor(1));
    event(1002);
    ASSERT_TRUE(receiver_.waitFor(2));
    EXPECT_THAT(receiver_.types(), ElementsAre(1001, 1002));
}

TEST_F(KSMsgQueueTest, ReadsThatKeepFailingArePaced) {
    SleeplessSystem system;
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    fake_norv::fail(Op::read, 5);
    receive();
    event(1001);
    event(1002);
    ASSERT_TRUE(receiver_.waitFor(2));
    EXPECT_THAT(system.naps(), ElementsAre(10000, 10000, 10000, 10000));
    queue_.reset();  // before the system
}

// A reply that comes about when its requester gives up reaches one of the two, and never a later request.
TEST_F(KSMsgQueueTest, NoReplyIsLostOrMistakenAroundTheTimeout) {
    receive();
    SleeplessSystem system;
    system.insteadOfNapping = [] { sched_yield(); };
    std::mutex lock;
    std::condition_variable changed;
    std::deque<Message> heard;
    bool stop = false;
    std::thread board([&] {
        for (;;) {
            std::unique_lock held(lock);
            changed.wait(held, [&] { return stop || !heard.empty(); });
            if (heard.empty())
                return;
            const Message answer = fake_norv::replyTo(heard.front(), replyType);
            heard.pop_front();
            held.unlock();
            fake_norv::deliver(answer);
        }
    });
    fake_norv::onWrite([&](const Message& message) {
        const std::lock_guard held(lock);
        if (message.type == commandType)
            heard.push_back(message);
        changed.notify_all();
    });
    constexpr unsigned rounds = 500;
    std::size_t got = 0;
    for (unsigned i = 0; i < rounds; ++i) {
        KSMsgRef msg = command(10000 + i);
        KSMsgRef back = queue_->request(msg, 10, replyType, 0);
        if (back.getMsgRef() == nullptr)
            continue;
        EXPECT_EQ(back.getTrans(), 10000 + i);
        back.free();
        ++got;
    }
    {
        const std::lock_guard held(lock);
        stop = true;
        changed.notify_all();
    }
    board.join();
    ASSERT_TRUE(fake_norv::waitForIdleReader());
    const std::size_t left = fake_norv::outstanding();  // in the slot: the last one, perhaps
    EXPECT_LE(left, 1U);
    EXPECT_EQ(got + receiver_.types().size() + left, rounds);
    queue_.reset();  // before the system
}

TEST(KSMsgQueueCreation, ATransportThatCannotBeOpenedThrows) {
    fake_norv::reset();
    fake_norv::fail(Op::open, 2);
    EXPECT_THROW(KSMsgQueue({}, 0, 0, nullptr), KSResource_CreationError);
    EXPECT_THROW(KSMsgQueue({}, 0, 0, "127.0.0.1:1"), KSResource_CreationError);
    EXPECT_EQ(fake_norv::openQueues(), 0U);
}

TEST(KSMsgQueueCreation, AReaderThatTheSystemRefusesThrowsAndLeavesNothingOpen) {
    fake_norv::reset();
    ThreadlessSystem system;
    EXPECT_THROW(KSMsgQueue({}, 0, 0, nullptr), KSResource_CreationError);
    EXPECT_EQ(fake_norv::openQueues(), 0U);
    EXPECT_EQ(fake_norv::outstanding(), 0U);
}

TEST(KSMsgQueueThreadCleanup, ItFreesTheMessageAndForgetsIt) {
    fake_norv::reset();
    NvMsg32Bit* msg = KSMsgRef(4U).getMsgRef();
    EXPECT_EQ(KSMsgQueueThread_Cleanup(&msg), nullptr);
    EXPECT_EQ(msg, nullptr);
    KSMsgQueueThread_Cleanup(&msg);
    EXPECT_EQ(fake_norv::count(Op::free), 1U);
}

}  // namespace
