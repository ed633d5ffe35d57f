// The system calls that the tests stand in for.
#ifndef HOSTSVC_KSSYSTEM_H
#define HOSTSVC_KSSYSTEM_H

#include <pthread.h>
#include <semaphore.h>
#include <sys/time.h>

// The base class makes the calls. Any thread may use it.
class KSSystem {
  public:
    KSSystem() = default;
    KSSystem(const KSSystem&) = delete;
    KSSystem& operator=(const KSSystem&) = delete;
    virtual ~KSSystem() = default;

    // The C library's sleep: what is left, in seconds.
    virtual unsigned sleep(unsigned seconds);

    // select on no descriptors: 0 when the time has passed, -1 when a signal came first.
    virtual int waitFor(timeval timeout);

    // Waits for a count of the semaphore, or for the mutex, and takes it: 0; ETIMEDOUT when the time has
    // passed, EINTR when a signal came first.
    virtual int waitForCount(sem_t& semaphore, timeval timeout);
    virtual int waitForLock(pthread_mutex_t& mutex, timeval timeout);

    // pthread_create: 0, or what was wrong.
    virtual int createThread(const pthread_attr_t* attributes, void* (*entry)(void*), void* argument);

    // sem_post: 0, or -1 when it is refused.
    virtual int post(sem_t* semaphore);
};

// The one in use.
KSSystem& ks_system();

// Puts another in its place, or the system itself back with null. The caller keeps it alive as long as any
// thread may call it.
void ks_useSystem(KSSystem* other);

#endif
