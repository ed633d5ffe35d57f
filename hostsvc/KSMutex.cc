#include "hostsvc/KSMutex.h"

#include "hostsvc/KSPoll.h"

#if defined(__SANITIZE_THREAD__)
#include <sanitizer/tsan_interface.h>

// The thread sanitizer takes a mutex to belong to the thread that locked it, and sees no order in an unlock
// from elsewhere. There is one, so it is told; and that its own look at the mutex on such an unlock does not
// count, or it would report whoever destroys the mutex next.
extern "C" void AnnotateIgnoreReadsBegin(const char* file, int line);
extern "C" void AnnotateIgnoreReadsEnd(const char* file, int line);

namespace {

void locked(void* mutex) { __tsan_acquire(mutex); }

int unlockOnce(pthread_mutex_t* mutex) {
    __tsan_release(mutex);
    AnnotateIgnoreReadsBegin(__FILE__, __LINE__);
    const int result = pthread_mutex_unlock(mutex);
    AnnotateIgnoreReadsEnd(__FILE__, __LINE__);
    return result;
}

}  // namespace
#else
namespace {

void locked(void* /*mutex*/) {}

int unlockOnce(pthread_mutex_t* mutex) { return pthread_mutex_unlock(mutex); }

}  // namespace
#endif

KSMutex::KSMutex() : mutex_() {
    if (pthread_mutex_init(&mutex_, nullptr) != 0)
        throw CreationError();
}

KSMutex::~KSMutex() { pthread_mutex_destroy(&mutex_); }

void KSMutex::lock() {
    pthread_mutex_lock(&mutex_);
    locked(&mutex_);
}

void KSMutex::unlock() {
    while (unlockOnce(&mutex_) != 0) {
    }
}

bool KSMutex::tryLock() {
    if (pthread_mutex_trylock(&mutex_) != 0)
        return false;
    locked(&mutex_);
    return true;
}

bool KSMutex::tryLock(unsigned timeoutMs, unsigned intervalMs) {
    return ks_poll(timeoutMs, intervalMs, [this] { return tryLock(); });
}
