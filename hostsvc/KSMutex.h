// A mutex without owner checking, so that it serves as a signal as well: one thread locks it and waits,
// another unlocks it.
#ifndef HOSTSVC_KSMUTEX_H
#define HOSTSVC_KSMUTEX_H

#include <pthread.h>

#include "hostsvc/KSException.h"

// What a thread did before its unlock is seen by the thread that locks next, whoever had locked it before.
class KSMutex {
  public:
    class CreationError : public virtual KSException {};

    KSMutex();  // throws CreationError
    KSMutex(const KSMutex&) = delete;
    KSMutex& operator=(const KSMutex&) = delete;
    virtual ~KSMutex();

    void lock();
    // From any thread, locked or not. Once it lets another thread in, it touches the mutex no more.
    void unlock();
    bool tryLock();
    // timeoutMs / intervalMs tries with intervalMs of sleep after each, and a last one. An unlock ends the
    // sleep early, and with it the wait. intervalMs is not 0.
    bool tryLock(unsigned timeoutMs, unsigned intervalMs);

  private:
    pthread_mutex_t mutex_;
};

#endif
