// A mutex without owner checking. It can therefore be used as a signal: one thread locks it and waits for it,
// another thread unlocks it.
#ifndef HOSTSVC_KSMUTEX_H
#define HOSTSVC_KSMUTEX_H

#include <pthread.h>

#include "hostsvc/KSException.h"

// The thread that locks the mutex sees everything that the thread that unlocked it did before, whichever
// thread had locked it.
class KSMutex {
  public:
    class CreationError : public virtual KSException {};

    KSMutex();  // throws CreationError
    KSMutex(const KSMutex&) = delete;
    KSMutex& operator=(const KSMutex&) = delete;
    virtual ~KSMutex();

    void lock();
    // Any thread may call it, whether the mutex is locked or not. Once another thread can lock the mutex,
    // this function does not touch it any more, so that the other thread may destroy it.
    void unlock();
    bool tryLock();
    // Tries timeoutMs / intervalMs times with a sleep of intervalMs after each try, and then once more. An
    // unlock during a sleep ends the wait with success. If intervalMs is 0, tries only once.
    bool tryLock(unsigned timeoutMs, unsigned intervalMs);

  private:
    pthread_mutex_t mutex_;
};

#endif
