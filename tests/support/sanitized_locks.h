// Included before all else by the host services' locks when they are built with the thread sanitizer.
//
// On purpose, another thread may unlock than the one that locked. The sanitizer takes a mutex to belong to
// the thread that locked it. It ignores an unlock by another thread, and then takes the mutex to be locked
// for ever. So these functions stand for the system's own. They call the C library directly, without the
// sanitizer, and tell the sanitizer the order that holds: everything before an unlock is seen after the next
// lock.
#ifndef TESTS_SUPPORT_SANITIZED_LOCKS_H
#define TESTS_SUPPORT_SANITIZED_LOCKS_H

#include <dlfcn.h>
#include <poll.h>
#include <pthread.h>
#include <sanitizer/tsan_interface.h>
#include <semaphore.h>

#include <cerrno>
#include <ctime>
#include <mutex>

namespace sanitized {

template <typename Call>
Call inTheLibrary(Call, const char* name) {
    return reinterpret_cast<Call>(dlsym(dlopen("libc.so.6", RTLD_LAZY | RTLD_NOLOAD), name));
}

// Tells the sanitizer that the thread has got the lock, unless the call's result says that it has not.
inline int acquired(int result, void* lock) {
    if (result == 0)
        __tsan_acquire(lock);
    return result;
}

inline int tryLock(pthread_mutex_t* mutex) {
    static const auto call = inTheLibrary(&pthread_mutex_trylock, "pthread_mutex_trylock");
    return acquired(call(mutex), mutex);
}

inline int clockLock(pthread_mutex_t* mutex, clockid_t clock, const timespec* end) {
    static const auto call = inTheLibrary(&pthread_mutex_clocklock, "pthread_mutex_clocklock");
    return acquired(call(mutex, clock, end), mutex);
}

// The sanitizer keeps a signal back until the thread calls the system through it. A thread that waits for
// long makes such a call every second, so that a signal takes effect nonetheless.
inline int lock(pthread_mutex_t* mutex) {
    for (;;) {
        timespec end{};
        clock_gettime(CLOCK_MONOTONIC, &end);
        ++end.tv_sec;
        if (const int result = clockLock(mutex, CLOCK_MONOTONIC, &end); result != ETIMEDOUT)
            return result;
        static_cast<void>(poll(nullptr, 0, 0));
    }
}

inline int unlock(pthread_mutex_t* mutex) {
    static const auto call = inTheLibrary(&pthread_mutex_unlock, "pthread_mutex_unlock");
    __tsan_release(mutex);
    return call(mutex);
}

// The sanitizer knows sem_post but not this call.
inline int clockWait(sem_t* semaphore, clockid_t clock, const timespec* end) {
    return acquired(sem_clockwait(semaphore, clock, end), semaphore);
}

}  // namespace sanitized

// Only a macro can stand for a function of the C library in one source and nowhere else. The library's
// headers are included above, so that theirs remain what they are.
#define pthread_mutex_lock sanitized::lock
#define pthread_mutex_trylock sanitized::tryLock
#define pthread_mutex_clocklock sanitized::clockLock
#define pthread_mutex_unlock sanitized::unlock
#define sem_clockwait sanitized::clockWait

#endif
