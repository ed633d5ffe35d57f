// A counting semaphore of this process.
#ifndef HOSTSVC_KSSEMAPHORE_H
#define HOSTSVC_KSSEMAPHORE_H

#include <semaphore.h>

#include "hostsvc/KSException.h"

class KSSemaphore {
  public:
    class CreationError : public virtual KSException {};
    class PostError : public virtual KSException {};

    // maxCount limits only the initial count; posts may raise the count above it. Throws CreationError.
    KSSemaphore(unsigned maxCount, unsigned initialCount);
    KSSemaphore(const KSSemaphore&) = delete;
    KSSemaphore& operator=(const KSSemaphore&) = delete;
    virtual ~KSSemaphore();

    void post();  // throws PostError
    void wait();  // continues to wait when a signal interrupts it
    bool tryWait();
    // Tries timeoutMs / intervalMs times with a sleep of intervalMs after each try, and then once more. A
    // post during a sleep ends the wait with success. If intervalMs is 0, tries only once.
    bool tryWait(unsigned timeoutMs, unsigned intervalMs);

  private:
    sem_t semaphore_;
};

#endif
