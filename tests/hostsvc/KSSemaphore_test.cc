#include "hostsvc/KSSemaphore.h"

#include <gmock/gmock.h>
#include <pthread.h>
#include <semaphore.h>

#include <atomic>
#include <climits>
#include <csignal>
#include <latch>
#include <string>
#include <thread>

#include "tests/support/test_system.h"

namespace {

using testing::Each;
using testing::IsEmpty;
using testing::SizeIs;

TEST(KSSemaphore, AnInitialCountAboveTheMaximumIsRefused) {
    EXPECT_THROW(KSSemaphore(2, 3), KSSemaphore::CreationError);
    EXPECT_THROW(KSSemaphore(1, 2), KSException);
    EXPECT_NO_THROW(KSSemaphore(2, 2));
    EXPECT_NO_THROW(KSSemaphore(0, 0));
}

TEST(KSSemaphore, AnInitialCountThatTheSystemCannotHoldIsRefused) {
    EXPECT_THROW(KSSemaphore(UINT_MAX, UINT_MAX), KSSemaphore::CreationError);
}

TEST(KSSemaphore, ItCountsPostsAndWaits) {
    KSSemaphore semaphore(2, 1);
    EXPECT_TRUE(semaphore.tryWait());
    EXPECT_FALSE(semaphore.tryWait());
    semaphore.post();
    semaphore.wait();
    EXPECT_FALSE(semaphore.tryWait());
}

TEST(KSSemaphore, TheMaximumDoesNotBoundPosts) {
    KSSemaphore semaphore(1, 1);
    semaphore.post();
    EXPECT_TRUE(semaphore.tryWait());
    EXPECT_TRUE(semaphore.tryWait());
}

TEST(KSSemaphore, APostThatTheSystemRefusesThrows) {
    KSSemaphore semaphore(UINT_MAX, INT_MAX);
    EXPECT_THROW(semaphore.post(), KSSemaphore::PostError);
}

TEST(KSSemaphore, APolledTryWaitPollsLikeTheMutex) {
    SleeplessSystem system;
    KSSemaphore semaphore(1, 0);
    EXPECT_FALSE(semaphore.tryWait(100, 10));
    EXPECT_THAT(system.naps(), SizeIs(10));
    EXPECT_THAT(system.naps(), Each(10000));
}

TEST(KSSemaphore, ATimeoutBelowTheIntervalMakesOneAttempt) {
    SleeplessSystem system;
    KSSemaphore semaphore(1, 1);
    EXPECT_TRUE(semaphore.tryWait(5, 10));
    EXPECT_FALSE(semaphore.tryWait(5, 10));
    EXPECT_THAT(system.naps(), IsEmpty());
}

TEST(KSSemaphore, ThePostIsSeenAtTheLastAttempt) {
    SleeplessSystem system;
    KSSemaphore semaphore(1, 0);
    system.insteadOfNapping = [&] {
        if (system.naps().size() == 10)
            semaphore.post();
    };
    EXPECT_TRUE(semaphore.tryWait(100, 10));
}

// The system itself, but it says when somebody begins a pause.
class WatchedPauses : public KSSystem {
  public:
    WatchedPauses() { ks_useSystem(this); }
    ~WatchedPauses() override { ks_useSystem(nullptr); }

    int waitForCount(sem_t& semaphore, timeval timeout) override {
        begun.count_down();
        return KSSystem::waitForCount(semaphore, timeout);
    }

    std::latch begun{1};
};

constexpr unsigned tooLongMs = 3600000;  // nobody waits for it: the test would be ended before

TEST(KSSemaphore, APostEndsThePauseAndIsTaken) {
    WatchedPauses system;
    KSSemaphore semaphore(1, 0);
    int carried = 0;
    std::thread waiter([&] {
        EXPECT_TRUE(semaphore.tryWait(tooLongMs, tooLongMs));
        EXPECT_EQ(carried, 7);
    });
    system.begun.wait();
    carried = 7;
    semaphore.post();
    waiter.join();
    EXPECT_FALSE(semaphore.tryWait());
}

TEST(KSSemaphore, APauseEndsByItself) {
    KSSemaphore semaphore(1, 0);
    EXPECT_FALSE(semaphore.tryWait(2, 1));
}

TEST(KSSemaphore, ASignalEndsAPauseAndIsReported) {
    SleeplessSystem system;
    system.napResult = -1;
    KSSemaphore semaphore(1, 0);
    testing::internal::CaptureStderr();
    EXPECT_FALSE(semaphore.tryWait(2, 1));
    const std::string line = "*** sleep_us interupted by signal ***\n";
    EXPECT_EQ(testing::internal::GetCapturedStderr(), line + line);
}

std::atomic<int> signalsHandled{0};

TEST(KSSemaphore, SignalsDoNotEndAWait) {
    signalsHandled = 0;
    struct sigaction handler {};
    handler.sa_handler = [](int) { ++signalsHandled; };  // no SA_RESTART: the system's wait is interrupted
    struct sigaction before {};
    sigaction(SIGUSR1, &handler, &before);
    KSSemaphore semaphore(1, 0);
    std::atomic<bool> ended{false};
    std::thread waiter([&] {
        semaphore.wait();
        ended = true;
    });
    for (int sent = 1; sent <= 3; ++sent) {
        pthread_kill(waiter.native_handle(), SIGUSR1);
        while (signalsHandled < sent)
            std::this_thread::yield();
    }
    EXPECT_FALSE(ended);
    semaphore.post();
    waiter.join();
    EXPECT_TRUE(ended);
    sigaction(SIGUSR1, &before, nullptr);
}

}  // namespace
