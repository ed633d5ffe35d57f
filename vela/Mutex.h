// Locks and counting semaphores of the object layer: the host's, with the layer's own exceptions.
#ifndef VELA_MUTEX_H
#define VELA_MUTEX_H

#include <memory>

#include "hostsvc/KSMutex.h"
#include "hostsvc/KSSemaphore.h"
#include "vela/Exception.h"

namespace vela {

// No owner is checked: one thread may take it and another release it, as a signal. Meets std::lock_guard's
// needs, which is how it is used as a lock.
class Mutex : public virtualObject {
  public:
    Mutex() : mutex_(std::make_unique<KSMutex>()) {}

    void lock() { mutex_->lock(); }
    void unlock() { mutex_->unlock(); }
    bool tryLock() { return mutex_->tryLock(); }
    // Tries totalMs / pollMs times with pollMs of sleep between, and once more. Throws Exception when pollMs
    // is 0.
    bool tryLock(unsigned int totalMs, unsigned int pollMs);

  private:
    std::unique_ptr<KSMutex> mutex_;
};

class Semaphore : public virtualObject {
  public:
    class PostError : public Exception {
      public:
        PostError() : Exception("vela::Seamphore::PostError") {}
    };

    // Throws KSSemaphore::CreationError when initialValue exceeds maxValue, which is not looked at again.
    Semaphore(unsigned int maxValue, unsigned int initialValue)
        : semaphore_(std::make_unique<KSSemaphore>(maxValue, initialValue)) {}

    void post();  // throws PostError
    void wait() { semaphore_->wait(); }
    bool tryWait() { return semaphore_->tryWait(); }
    bool tryWait(unsigned int totalMs, unsigned int pollMs);  // as Mutex::tryLock

  private:
    std::unique_ptr<KSSemaphore> semaphore_;
};

}  // namespace vela

#endif
