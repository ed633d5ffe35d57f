// A counting semaphore of this process.
#ifndef HOSTSVC_KSSEMAPHORE_H
#define HOSTSVC_KSSEMAPHORE_H

#include <semaphore.h>

#include "hostsvc/KSException.h"

class KSSemaphore {
  public:
    class CreationError : public virtual KSException {};
    class PostError : public virtual KSException {};

    // maxCount bounds the initial count alone; posts may go beyond it. Throws CreationError.
    KSSemaphore(unsigned maxCount, unsigned initialCount);
    KSSemaphore(const KSSemaphore&) = delete;
    KSSemaphore& operator=(const KSSemaphore&) = delete;
    virtual ~KSSemaphore();

    void post();  // throws PostError
    void wait();  // goes on waiting when a signal interrupts it
    bool tryWait();
    // timeoutMs / intervalMs tries with intervalMs of sleep after each, and a last one. A post ends the sleep
    // early, and with it the wait. intervalMs is not 0.
    bool tryWait(unsigned timeoutMs, unsigned intervalMs);

  private:
    sem_t semaphore_;
};

#endif
