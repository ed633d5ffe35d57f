#include "hostsvc/KSMutex.h"

#include <gmock/gmock.h>

#include <latch>
#include <thread>

#include "tests/support/test_system.h"

namespace {

using testing::Each;
using testing::IsEmpty;
using testing::SizeIs;

TEST(KSMutex, TryLockFailsWhileItIsHeldAndSucceedsAfter) {
    KSMutex mutex;
    mutex.lock();
    EXPECT_FALSE(mutex.tryLock());
    mutex.unlock();
    EXPECT_TRUE(mutex.tryLock());
    mutex.unlock();
}

TEST(KSMutex, AThreadUnlocksWhatAnotherHasLockedAndSoSignals) {
    for (int round = 0; round < 50; ++round) {
        KSMutex mutex;
        int carried = 0;
        mutex.lock();
        std::thread other([&] {
            carried = 7;
            mutex.unlock();
        });
        mutex.lock();
        EXPECT_EQ(carried, 7);
        mutex.unlock();
        other.join();
    }
}

TEST(KSMutex, UnlockingAFreeMutexLeavesItFree) {
    KSMutex mutex;
    mutex.unlock();
    EXPECT_TRUE(mutex.tryLock());
    EXPECT_FALSE(mutex.tryLock());
    mutex.unlock();
}

TEST(KSMutex, APolledTryLockOnAHeldMutexSleepsTenTimesTenMilliseconds) {
    SleeplessSystem system;
    KSMutex mutex;
    mutex.lock();
    EXPECT_FALSE(mutex.tryLock(100, 10));
    EXPECT_THAT(system.naps(), SizeIs(10));
    EXPECT_THAT(system.naps(), Each(10000));
    mutex.unlock();
}

TEST(KSMutex, TheEleventhAttemptComesAfterTheTenthSleep) {
    SleeplessSystem system;
    KSMutex mutex;
    mutex.lock();
    system.insteadOfNapping = [&] {
        if (system.naps().size() == 10)
            mutex.unlock();
    };
    EXPECT_TRUE(mutex.tryLock(100, 10));
    EXPECT_THAT(system.naps(), SizeIs(10));
    mutex.unlock();
}

TEST(KSMutex, APolledTryLockStopsSleepingOnceItSucceeds) {
    SleeplessSystem system;
    KSMutex mutex;
    mutex.lock();
    system.insteadOfNapping = [&] {
        if (system.naps().size() == 3)
            mutex.unlock();
    };
    EXPECT_TRUE(mutex.tryLock(1000, 100));
    EXPECT_THAT(system.naps(), testing::ElementsAre(100000, 100000, 100000));
    mutex.unlock();
}

// The system itself, but it says when somebody begins a pause.
class WatchedPauses : public KSSystem {
  public:
    WatchedPauses() { ks_useSystem(this); }
    ~WatchedPauses() override { ks_useSystem(nullptr); }

    int waitForLock(pthread_mutex_t& mutex, timeval timeout) override {
        begun.count_down();
        return KSSystem::waitForLock(mutex, timeout);
    }

    std::latch begun{1};
};

TEST(KSMutex, AnUnlockEndsThePauseAndLetsTheWaiterIn) {
    constexpr unsigned tooLongMs = 3600000;  // nobody waits for it: the test would be ended before
    WatchedPauses system;
    KSMutex mutex;
    int carried = 0;
    mutex.lock();
    std::thread waiter([&] {
        EXPECT_TRUE(mutex.tryLock(tooLongMs, tooLongMs));
        EXPECT_EQ(carried, 7);
    });
    system.begun.wait();
    carried = 7;
    mutex.unlock();
    waiter.join();
    EXPECT_FALSE(mutex.tryLock());
    mutex.unlock();
}

TEST(KSMutex, APauseEndsByItself) {
    KSMutex mutex;
    mutex.lock();
    EXPECT_FALSE(mutex.tryLock(2, 1));
    mutex.unlock();
}

TEST(KSMutex, ATimeoutBelowTheIntervalMakesOneAttempt) {
    SleeplessSystem system;
    KSMutex mutex;
    mutex.lock();
    EXPECT_FALSE(mutex.tryLock(5, 10));
    EXPECT_THAT(system.naps(), IsEmpty());
    mutex.unlock();
    EXPECT_TRUE(mutex.tryLock(5, 10));
    mutex.unlock();
}

}  // namespace
