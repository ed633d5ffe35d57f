// Locks and counting semaphores of the object layer. They wrap those of the host services and throw this
// layer's exceptions.
#ifndef VELA_MUTEX_H
#define VELA_MUTEX_H

#include <memory>

#include "hostsvc/KSMutex.h"
#include "hostsvc/KSSemaphore.h"
#include "vela/Exception.h"

namespace vela {

// The mutex has no owner: one thread may lock it and another unlock it, as a signal. It can be used with
// std::lock_guard.
class Mutex : public virtualObject {
  public:
    Mutex() : mutex_(std::make_unique<KSMutex>()) {}

    void lock() { mutex_->lock(); }
    void unlock() { mutex_->unlock(); }
    bool tryLock() { return mutex_->tryLock(); }
    // Tries totalMs / pollMs times with a sleep of pollMs after each try, and then once more. Throws
    // Exception when pollMs is 0.
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

    // Throws KSSemaphore::CreationError when initialValue is above maxValue. maxValue does not limit posts.
    Semaphore(unsigned int maxValue, unsigned int initialValue)
        : semaphore_(std::make_unique<KSSemaphore>(maxValue, initialValue)) {}

    void post();  // throws PostError
    void wait() { semaphore_->wait(); }
    bool tryWait() { return semaphore_->tryWait(); }
    bool tryWait(unsigned int totalMs, unsigned int pollMs);  // tries and sleeps as Mutex::tryLock does

  private:
    std::unique_ptr<KSSemaphore> semaphore_;
};

}  // namespace vela

#endif
