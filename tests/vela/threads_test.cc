// Threads, locks and semaphores of the layer, and its process-wide functions.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>

#include "tests/support/test_system.h"
#include "tests/vela/transport.h"
#include "vela/Mutex.h"
#include "vela/Thread.h"
#include "vela/vela.h"

namespace {

using vela::Mutex;
using vela::Semaphore;
using vela::Thread;

// The argument of the thread functions below.
struct Job : Thread::Runnable {
    Signal started, ended;
    std::atomic<bool> mayEnd{false};
    std::atomic<int> cleanups{0};

    void* member(Thread::control* ctl, void* arg) {
        seen = ctl != nullptr;
        ended.raise();
        return arg;
    }
    void* cleanUp(void* arg) {
        cleanups += *static_cast<int*>(arg);
        return nullptr;
    }
    std::atomic<bool> seen{false};
};

void* untilAllowed(Thread::control* ctl, void* arg) {
    auto* const job = static_cast<Job*>(arg);
    job->started.raise();
    while (!job->mayEnd)
        ctl->testCancel();
    job->ended.raise();
    return arg;
}

void* untilCancelled(Thread::control* ctl, void* arg) {
    static int one = 1, ten = 10, hundred = 100;
    auto* const job = static_cast<Job*>(arg);
    const auto routine = static_cast<void* (Thread::Runnable::*)(void*)>(&Job::cleanUp);
    ctl->pushCleanup(static_cast<Thread::Runnable*>(job), routine, &one);
    ctl->pushCleanup(static_cast<Thread::Runnable*>(job), routine, &ten);
    ctl->pushCleanup(
        [](void* counted) -> void* {
            ++*static_cast<std::atomic<int>*>(counted);
            return nullptr;
        },
        &job->cleanups);
    ctl->pushCleanup(static_cast<Thread::Runnable*>(job), routine, &hundred);
    EXPECT_NE(ctl->popCleanup(0), 0);
    job->started.raise();
    while (true)
        ctl->testCancel();
}

TEST(Thread, RunsItsFunctionAndKeepsTheResult) {
    Job job;
    Thread thread(&untilAllowed, 0);
    thread.start(&job);
    job.mayEnd = true;
    thread.join();
    EXPECT_EQ(thread.getResult(), &job);
}

TEST(Thread, RunsAMemberFunctionOfAnObject) {
    Job job;
    int argument = 0;
    Thread thread(static_cast<Thread::Runnable*>(&job), static_cast<Thread::Member>(&Job::member), 0);
    thread.start(&argument);
    thread.join();
    EXPECT_EQ(thread.getResult(), &argument);
    EXPECT_TRUE(job.seen);
}

TEST(Thread, StartedWhileItRunsIsRefusedAndRunsOn) {
    Job job;
    Thread thread(&untilAllowed, 0);
    thread.start(&job);
    try {
        thread.start(nullptr);
        FAIL() << "nothing was thrown";
    } catch (const Thread::AlreadyActive& exception) {
        EXPECT_EQ(printed(exception), "vela::Thread::AlreadyActive");
    }
    job.mayEnd = true;
    thread.join();
    EXPECT_EQ(thread.getResult(), &job);
    thread.start(&job);
    thread.join();
}

TEST(Thread, CancelledRunsItsCleanUpsAndEnds) {
    Job job;
    Thread thread(&untilCancelled, 0);
    thread.start(&job);
    ASSERT_TRUE(job.started.wait());
    thread.cancel();
    thread.join();
    EXPECT_EQ(job.cleanups, 12);
    EXPECT_EQ(thread.getResult(), nullptr);
}

TEST(Thread, DestroyedWhileItRunsIsCancelledFirst) {
    Job job;
    {
        Thread thread(&untilCancelled, 0);
        thread.start(&job);
        ASSERT_TRUE(job.started.wait());
    }
    EXPECT_EQ(job.cleanups, 12);
}

TEST(Thread, JoinedBeforeItWasStartedReturnsAtOnce) {
    Thread thread(&untilAllowed, 0);
    thread.join();
}

TEST(Thread, AbandonedRunsOnWithoutItsObject) {
    Job job;
    {
        Thread thread(&untilAllowed, 0);
        thread.start(&job);
        ASSERT_TRUE(job.started.wait());
        thread.abandon();
        thread.cancel();
        thread.join();
        EXPECT_EQ(thread.getResult(), nullptr);
        EXPECT_THROW(thread.start(&job), Thread::AlreadyActive);
    }
    job.mayEnd = true;
    EXPECT_TRUE(job.ended.wait());
}

// A thread that abandons itself before the starting thread may know that it runs.
struct Leaver {
    std::unique_ptr<Thread> thread;
    Signal gone;
};

void* leaves(Thread::control*, void* arg) {
    auto* const leaver = static_cast<Leaver*>(arg);
    leaver->thread->abandon();
    leaver->gone.raise();
    return nullptr;
}

TEST(Thread, AbandonedByItsOwnBodyIsLetGoOnce) {
    for (int round = 0; round < 200; ++round) {
        Leaver leaver{std::make_unique<Thread>(&leaves, 0), {}};
        leaver.thread->start(&leaver);
        ASSERT_TRUE(leaver.gone.wait());
        EXPECT_THROW(leaver.thread->start(&leaver), Thread::AlreadyActive);
    }
}

TEST(Thread, AbandonedBeforeItIsStartedOrAfterItHasEndedLeavesNothingBehind) {
    Job job;
    job.mayEnd = true;
    {
        Thread never(&untilAllowed, 0);
        never.abandon();
    }
    {
        Thread before(&untilAllowed, 0);
        before.abandon();
        before.start(&job);
    }
    ASSERT_TRUE(job.ended.wait());
    Thread after(&untilAllowed, 0);
    after.start(&job);
    ASSERT_TRUE(job.ended.wait(2));
    after.abandon();
    Thread joined(&untilAllowed, 0);
    joined.start(&job);
    joined.join();
    joined.abandon();
}

TEST(Thread, RefusedByTheSystemIsACreationError) {
    const ThreadlessSystem none;
    Job job;
    Thread thread(&untilAllowed, 0);
    try {
        thread.start(&job);
        FAIL() << "nothing was thrown";
    } catch (const Thread::CreationError& exception) {
        EXPECT_EQ(printed(exception), "vela::Thread::CreationError");
    }
    EXPECT_THROW(vela::AbandonedThread_create(&untilAllowed, &job, 0), Thread::CreationError);
}

void* raiseEnded(Thread::control* ctl, void* arg) {
    EXPECT_EQ(ctl, nullptr);
    static_cast<Job*>(arg)->ended.raise();
    return nullptr;
}

TEST(AbandonedThread, RunsAFunctionOrAMemberWithoutAControl) {
    Job job;
    vela::AbandonedThread_create(&raiseEnded, &job, 0);
    ASSERT_TRUE(job.ended.wait());
    vela::AbandonedThread_create(static_cast<Thread::Runnable*>(&job),
                                 static_cast<Thread::Member>(&Job::member), nullptr, 1 << 20);
    ASSERT_TRUE(job.ended.wait(2));
    EXPECT_FALSE(job.seen);
}

const struct Polls {
    const char* says;
    unsigned int totalMs, pollMs;
    std::size_t sleeps;
} polls[] = {
    {"ten sleeps, eleven tries", 1000, 100, 10},
    {"one try", 50, 100, 0},
    {"no time", 0, 10, 0},
    {"two sleeps, three tries", 25, 10, 2},
};

TEST(Mutex, TriesAgainAndAgainAndOnceMore) {
    for (const Polls& c : polls) {
        const SleeplessSystem system;
        Mutex mutex;
        mutex.lock();
        EXPECT_FALSE(mutex.tryLock(c.totalMs, c.pollMs)) << c.says;
        EXPECT_EQ(system.naps().size(), c.sleeps) << c.says;
        for (const long nap : system.naps())
            EXPECT_EQ(nap, c.pollMs * 1000L) << c.says;
        mutex.unlock();
    }
}

TEST(Mutex, FreedDuringTheLastSleepIsTaken) {
    SleeplessSystem system;
    Mutex mutex;
    mutex.lock();
    std::size_t sleeps = 0;
    system.insteadOfNapping = [&] {
        if (++sleeps == 10)
            mutex.unlock();
    };
    EXPECT_TRUE(mutex.tryLock(1000, 100));
    EXPECT_FALSE(mutex.tryLock());
    mutex.unlock();
}

TEST(Mutex, FreeIsTakenAtOnce) {
    const SleeplessSystem system;
    Mutex mutex;
    EXPECT_TRUE(mutex.tryLock());
    EXPECT_FALSE(mutex.tryLock());
    mutex.unlock();
    EXPECT_TRUE(mutex.tryLock(1000, 100));
    mutex.unlock();
    EXPECT_TRUE(system.naps().empty());
}

TEST(Semaphore, WaitsAndPolls) {
    for (const Polls& c : polls) {
        const SleeplessSystem system;
        Semaphore semaphore(3, 0);
        EXPECT_FALSE(semaphore.tryWait(c.totalMs, c.pollMs)) << c.says;
        EXPECT_EQ(system.naps().size(), c.sleeps) << c.says;
    }
    Semaphore semaphore(3, 2);
    semaphore.wait();
    EXPECT_TRUE(semaphore.tryWait());
    EXPECT_FALSE(semaphore.tryWait());
    semaphore.post();
    EXPECT_TRUE(semaphore.tryWait(10, 10));
}

TEST(Semaphore, BeginsAtItsMaximumAtMost) {
    EXPECT_THROW(Semaphore(1, 2), KSSemaphore::CreationError);
    EXPECT_NO_THROW(Semaphore(2, 2));
}

TEST(Semaphore, PostedBeyondWhatTheSystemCountsIsAPostError) {
    constexpr unsigned int most = 0x7FFFFFFF;
    Semaphore semaphore(most, most);
    try {
        semaphore.post();
        FAIL() << "nothing was thrown";
    } catch (const Semaphore::PostError& exception) {
        EXPECT_EQ(printed(exception), "vela::Seamphore::PostError");
    }
}

TEST(Polling, WithoutAnIntervalIsRejected) {
    Mutex mutex;
    Semaphore semaphore(1, 1);
    EXPECT_THROW(mutex.tryLock(100, 0), vela::Exception);
    EXPECT_THROW(semaphore.tryWait(100, 0), vela::Exception);
    EXPECT_TRUE(mutex.tryLock()) << "it was not taken";
    EXPECT_TRUE(semaphore.tryWait()) << "it was not taken";
    mutex.unlock();
}

TEST(Sleep, GoesToTheSystem) {
    const SleeplessSystem system;
    vela::sleep(7);
    vela::sleep_ms(1001);
    EXPECT_THAT(system.sleeps(), testing::ElementsAre(7));
    EXPECT_THAT(system.naps(), testing::ElementsAre(1001000));
}

// In a process where nothing has asked for one before.
TEST(UniqueNumbers, BeginAt1000AndAt10000) {
    testing::GTEST_FLAG(death_test_style) = "threadsafe";
    EXPECT_EXIT(
        {
            const bool right = vela::getUniqueTransId() == 10000 && vela::getUniqueTransId() == 10001 &&
                               vela::getUniqueObjId() == 1000 && vela::getUniqueObjId() == 1001;
            std::_Exit(right ? 0 : 1);
        },
        testing::ExitedWithCode(0), "");
}

TEST(Init, PreparesTheTransportAndReturnsItsStatus) {
    fake_norv::reset();
    EXPECT_EQ(vela::velaInit(), 0U);
    fake_norv::fail(fake_norv::Op::setInterface);
    EXPECT_EQ(vela::velaInit(), 2U);
    vela::velaCleanup();
    EXPECT_THAT(fake_norv::texts(),
                testing::ElementsAre("nvDrvSetInterface(0, 0)", "nvDrvSetInterface(0, 0)"));
}

}  // namespace
