#include "hostsvc/KSMutex.h"

#include "hostsvc/KSPoll.h"
#include "hostsvc/KSPosixMutex.h"
#include "hostsvc/KSSystem.h"

KSMutex::KSMutex() : mutex_() {
    if (pthread_mutex_init(&mutex_, nullptr) != 0)
        throw CreationError();
}

KSMutex::~KSMutex() { pthread_mutex_destroy(&mutex_); }

void KSMutex::lock() { ks_posix::lock(&mutex_); }

void KSMutex::unlock() {
    while (ks_posix::unlock(&mutex_) != 0) {
    }
}

bool KSMutex::tryLock() { return ks_posix::tryLock(&mutex_) == 0; }

bool KSMutex::tryLock(unsigned timeoutMs, unsigned intervalMs) {
    return ks_poll(
        timeoutMs, intervalMs, [this] { return tryLock(); },
        [this](timeval pause) { return ks_system().waitForLock(mutex_, pause); });
}
