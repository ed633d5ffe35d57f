// The system's mutex calls that KSMutex makes. On purpose, another thread may unlock than the one that
// locked.
#ifndef HOSTSVC_KSPOSIXMUTEX_H
#define HOSTSVC_KSPOSIXMUTEX_H

#include <pthread.h>
#include <time.h>

#if defined(__SANITIZE_THREAD__)
#include <dlfcn.h>
#include <poll.h>
#include <sanitizer/tsan_interface.h>

#include <cerrno>

// The thread sanitizer takes a mutex to belong to the thread that locked it. It ignores an unlock by another
// thread, and then takes the mutex to be locked for ever. So these functions call the C library directly,
// without the sanitizer, and tell the sanitizer the order that holds: everything before an unlock is seen
// after the next lock.
namespace ks_posix {

using MutexCall = int (*)(pthread_mutex_t*);

template <typename Call = MutexCall>
Call inTheLibrary(const char* name) {
    return reinterpret_cast<Call>(dlsym(dlopen("libc.so.6", RTLD_LAZY | RTLD_NOLOAD), name));
}

inline int tryLock(pthread_mutex_t* mutex) {
    static const MutexCall call = inTheLibrary("pthread_mutex_trylock");
    const int result = call(mutex);
    if (result == 0)
        __tsan_acquire(mutex);
    return result;
}

inline int clockLock(pthread_mutex_t* mutex, clockid_t clock, const timespec* end) {
    static const auto call = inTheLibrary<decltype(&pthread_mutex_clocklock)>("pthread_mutex_clocklock");
    const int result = call(mutex, clock, end);
    if (result == 0)
        __tsan_acquire(mutex);
    return result;
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
    static const MutexCall call = inTheLibrary("pthread_mutex_unlock");
    __tsan_release(mutex);
    return call(mutex);
}

}  // namespace ks_posix
#else
namespace ks_posix {

inline int lock(pthread_mutex_t* mutex) { return pthread_mutex_lock(mutex); }
inline int tryLock(pthread_mutex_t* mutex) { return pthread_mutex_trylock(mutex); }
inline int clockLock(pthread_mutex_t* mutex, clockid_t clock, const timespec* end) {
    return pthread_mutex_clocklock(mutex, clock, end);
}
inline int unlock(pthread_mutex_t* mutex) { return pthread_mutex_unlock(mutex); }

}  // namespace ks_posix
#endif

#endif
