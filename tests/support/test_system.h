// Replacements for the system calls of the host services. An object replaces them from its constructor to its
// destructor.
#ifndef TESTS_SUPPORT_TEST_SYSTEM_H
#define TESTS_SUPPORT_TEST_SYSTEM_H

#include <algorithm>
#include <cerrno>
#include <functional>
#include <mutex>
#include <utility>
#include <vector>

#include "hostsvc/KSSystem.h"

// Sleeps take no time: they are recorded, and a function of the test may run instead.
class SleeplessSystem : public KSSystem {
  public:
    SleeplessSystem() { ks_useSystem(this); }
    ~SleeplessSystem() override { ks_useSystem(nullptr); }

    // The microseconds of each short sleep so far.
    std::vector<long> naps() const {
        const std::lock_guard lock(lock_);
        return naps_;
    }
    // The seconds of each long sleep so far.
    std::vector<unsigned> sleeps() const {
        const std::lock_guard lock(lock_);
        return sleeps_;
    }

    std::function<void()> insteadOfNapping;  // set before any thread sleeps
    int napResult = 0;                       // -1: as if a signal had interrupted the sleep

    unsigned sleep(unsigned seconds) override {
        const std::lock_guard lock(lock_);
        sleeps_.push_back(seconds);
        return 0;
    }

    int waitFor(timeval timeout) override {
        {
            const std::lock_guard lock(lock_);
            naps_.push_back(timeout.tv_sec * 1000000L + timeout.tv_usec);
        }
        if (insteadOfNapping)
            insteadOfNapping();
        return napResult;
    }

    // These waits last their whole time: no post and no unlock ends them.
    int waitForCount(sem_t& /*semaphore*/, timeval timeout) override { return interruptedOrOver(timeout); }
    int waitForLock(pthread_mutex_t& /*mutex*/, timeval timeout) override {
        return interruptedOrOver(timeout);
    }

  private:
    int interruptedOrOver(timeval timeout) { return waitFor(timeout) == 0 ? ETIMEDOUT : EINTR; }

    mutable std::mutex lock_;
    std::vector<long> naps_;
    std::vector<unsigned> sleeps_;
};

// The system refuses every new thread.
class ThreadlessSystem : public KSSystem {
  public:
    ThreadlessSystem() { ks_useSystem(this); }
    ~ThreadlessSystem() override { ks_useSystem(nullptr); }

    int createThread(const pthread_attr_t* /*attributes*/, void* (* /*entry*/)(void*),
                     void* /*argument*/) override {
        return 11;
    }
};

#endif
