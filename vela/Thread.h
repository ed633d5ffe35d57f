// Threads of the object layer. They wrap KSThread and throw this layer's exceptions.
//
// Cancellation is cooperative: cancel() only sets a flag. It takes effect when the body next calls
// testCancel.
#ifndef VELA_THREAD_H
#define VELA_THREAD_H

#include <atomic>
#include <memory>

#include "hostsvc/KSThread.h"
#include "vela/Exception.h"

namespace vela {

class Thread : public virtualObject {
  public:
    class AlreadyActive : public Exception {
      public:
        AlreadyActive() : Exception("vela::Thread::AlreadyActive") {}
    };
    class CreationError : public Exception {
      public:
        CreationError() : Exception("vela::Thread::CreationError") {}
    };

    // The base class of objects whose member functions are thread bodies.
    class Runnable : public KSRunnable {};

    // The control that the body gets. It must only be used on the body's own thread.
    class control {
      public:
        explicit control(KSThread::control* primitive) : primitive_(primitive) {}

        // If cancel() has been called, runs the clean-up routines and ends the thread.
        void testCancel() { primitive_->testCancel(); }
        // Pushes a clean-up routine, which runs if the thread is cancelled or ends while the routine is
        // pushed.
        void pushCleanup(void* (*routine)(void*), void* arg) { primitive_->pushCleanup(routine, arg); }
        void pushCleanup(void* object, void* (Runnable::*routine)(void*), void* arg);
        // Takes the newest clean-up routine off the stack and runs it if execute is not 0. Returns 0 when no
        // more are pushed.
        int popCleanup(int execute) { return primitive_->popCleanup(execute); }

      private:
        KSThread::control* primitive_;
    };

    using Function = void* (*)(control*, void*);
    using Member = void* (Runnable::*)(control*, void*);

    // The body and its argument, while they are handed to the new thread.
    struct Errand {
        Function function;
        void* object;
        Member member;
        void* arg;

        void* run(control* ctl) const;
    };

    // Makes a thread, which start() starts. stackSize is in octets; 0 means the system's default. Throws
    // CreationError.
    Thread(Function body, unsigned int stackSize);
    Thread(void* object, Member body, unsigned int stackSize);
    Thread(const Thread&) = delete;
    Thread& operator=(const Thread&) = delete;
    ~Thread() override;

    // Throws AlreadyActive when the thread is running, and CreationError when the system refuses it.
    void start(void* arg);
    void cancel();
    void join();
    void* getResult();
    // Lets the running thread, or the next one that is started, run by itself: it cleans up after itself,
    // this object may be destroyed before the thread ends, and the object's other functions do not reach the
    // thread any more. The body may call abandon(), even before start() has returned. All other functions are
    // called by one thread at a time.
    void abandon();

  private:
    Thread(const Errand& errand, unsigned int stackSize);
    void letGo();

    Errand errand_;
    std::unique_ptr<KSThread> thread_;  // null once the thread is abandoned and runs
    std::atomic<bool> started_{false};  // started, and not joined since
    std::atomic<bool> abandoned_{false};
    std::atomic<bool> letGo_{false};  // set by start() or by abandon(), whichever comes second
};

// Start a thread that nobody joins. Its body gets a null control. Throw Thread::CreationError.
void AbandonedThread_create(Thread::Function body, void* arg, unsigned int stackSize);
void AbandonedThread_create(void* object, Thread::Member body, void* arg, unsigned int stackSize);
// The same without memory of its own: the errand has to live until the body has begun.
void AbandonedThread_create(Thread::Errand& errand, unsigned int stackSize);

}  // namespace vela

#endif
