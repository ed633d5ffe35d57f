#include "hostsvc/KSSemaphore.h"

#include "hostsvc/KSPoll.h"
#include "hostsvc/KSSystem.h"

KSSemaphore::KSSemaphore(unsigned maxCount, unsigned initialCount) : semaphore_() {
    if (initialCount > maxCount || sem_init(&semaphore_, 0, initialCount) != 0)
        throw CreationError();
}

KSSemaphore::~KSSemaphore() { sem_destroy(&semaphore_); }

void KSSemaphore::post() {
    if (ks_system().post(&semaphore_) != 0)
        throw PostError();
}

void KSSemaphore::wait() {
    while (sem_wait(&semaphore_) != 0) {
    }
}

bool KSSemaphore::tryWait() { return sem_trywait(&semaphore_) == 0; }

bool KSSemaphore::tryWait(unsigned timeoutMs, unsigned intervalMs) {
    return ks_poll(
        timeoutMs, intervalMs, [this] { return tryWait(); },
        [this](timeval pause) { return ks_system().waitForCount(semaphore_, pause); });
}
