#include "hostsvc/KSSystem.h"

#include <sys/select.h>
#include <unistd.h>

#undef NDEBUG  // or <cassert> hides __assert_fail
#include <atomic>
#include <cassert>
#include <cerrno>
#include <ctime>
#include <memory>

namespace {

std::atomic<KSSystem*> standIn{nullptr};

// The time in `timeout` from now, on the monotonic clock, which nobody sets.
timespec after(timeval timeout) {
    constexpr long perSecond = 1000000000;
    timespec then{};
    clock_gettime(CLOCK_MONOTONIC, &then);
    then.tv_sec += timeout.tv_sec;
    then.tv_nsec += timeout.tv_usec * 1000;
    if (then.tv_nsec >= perSecond) {
        ++then.tv_sec;
        then.tv_nsec -= perSecond;
    }
    return then;
}

}  // namespace

unsigned KSSystem::sleep(unsigned seconds) { return ::sleep(seconds); }

int KSSystem::waitFor(timeval timeout) { return ::select(0, nullptr, nullptr, nullptr, &timeout); }

int KSSystem::waitForCount(sem_t& semaphore, timeval timeout) {
    const timespec end = after(timeout);
    return ::sem_clockwait(&semaphore, CLOCK_MONOTONIC, &end) == 0 ? 0 : errno;
}

int KSSystem::waitForLock(pthread_mutex_t& mutex, timeval timeout) {
    const timespec end = after(timeout);
    return ::pthread_mutex_clocklock(&mutex, CLOCK_MONOTONIC, &end);
}

int KSSystem::createThread(const pthread_attr_t* attributes, void* (*entry)(void*), void* argument) {
    pthread_t unused = 0;
    return ::pthread_create(&unused, attributes, entry, argument);
}

int KSSystem::post(sem_t* semaphore) { return ::sem_post(semaphore); }

KSSystem& ks_system() {
    // Never destroyed, because threads may still sleep while the process exits.
    static KSSystem* const real = std::make_unique<KSSystem>().release();
    KSSystem* const other = standIn.load();
    return other != nullptr ? *other : *real;
}

void ks_useSystem(KSSystem* other) { standIn.store(other); }

void ks_assertionFailed(const char* expression, const char* source, unsigned line, const char* function) {
    __assert_fail(expression, source, line, function);
}
