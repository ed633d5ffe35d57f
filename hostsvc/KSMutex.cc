#include "hostsvc/KSMutex.h"

#include "hostsvc/KSPoll.h"
#include "hostsvc/KSSystem.h"

KSMutex::KSMutex() : mutex_() {
    if (pthread_mutex_init(&mutex_, nullptr) != 0)
        throw CreationError();
}

KSMutex::~KSMutex() { pthread_mutex_destroy(&mutex_); }

void KSMutex::lock() { pthread_mutex_lock(&mutex_); }

void KSMutex::unlock() {
    while (pthread_mutex_unlock(&mutex_) != 0) {
    }
}

bool KSMutex::tryLock() { return pthread_mutex_trylock(&mutex_) == 0; }

bool KSMutex::tryLock(unsigned timeoutMs, unsigned intervalMs) {
    return ks_poll(
        timeoutMs, intervalMs, [this] { return tryLock(); },
        [this](timeval pause) { return ks_system().waitForLock(mutex_, pause); });
}
