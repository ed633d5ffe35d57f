// The system calls that tests can replace, and the end of the process through a failed assertion.
#ifndef HOSTSVC_KSSYSTEM_H
#define HOSTSVC_KSSYSTEM_H

#include <pthread.h>
#include <semaphore.h>
#include <sys/time.h>

// This class makes the real calls; tests derive from it. Any thread may call it.
class KSSystem {
  public:
    KSSystem() = default;
    KSSystem(const KSSystem&) = delete;
    KSSystem& operator=(const KSSystem&) = delete;
    virtual ~KSSystem() = default;

    // The C library's sleep. Returns the seconds that are left.
    virtual unsigned sleep(unsigned seconds);

    // A select on no descriptors. Returns 0 when the time has passed, -1 when a signal interrupted it.
    virtual int waitFor(timeval timeout);

    // Waits until the semaphore can be decremented or the mutex be locked, does that, and returns 0. Returns
    // ETIMEDOUT when the time has passed, and EINTR when a signal interrupted the wait.
    virtual int waitForCount(sem_t& semaphore, timeval timeout);
    virtual int waitForLock(pthread_mutex_t& mutex, timeval timeout);

    // pthread_create. Returns 0 or an error number.
    virtual int createThread(const pthread_attr_t* attributes, void* (*entry)(void*), void* argument);

    // sem_post. Returns 0, or -1 when the system refuses it.
    virtual int post(sem_t* semaphore);
};

// The object that is in use.
KSSystem& ks_system();

// Makes another object be used; null means the real calls again. The caller keeps the object alive as long as
// any thread may call it.
void ks_useSystem(KSSystem* other);

// Ends the process as a failed assertion does, in every build. The report names the place that the caller
// gives.
[[noreturn]] void ks_assertionFailed(const char* expression, const char* source, unsigned line,
                                     const char* function);

#endif
