// Threads of the object layer: KSThread with the layer's own exceptions.
//
// Cancellation is cooperative: cancel() only raises a flag, which the body sees at its next testCancel.
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

    // The base of objects whose member functions run as threads.
    class Runnable : public KSRunnable {};

    // Handed to the body; used on the body's own thread only.
    class control {
      public:
        explicit control(KSThread::control* primitive) : primitive_(primitive) {}

        // A pending cancel() takes effect here: clean-ups run and the thread ends.
        void testCancel() { primitive_->testCancel(); }
        // Runs if the thread is cancelled or exits while it is pushed.
        void pushCleanup(void* (*routine)(void*), void* arg) { primitive_->pushCleanup(routine, arg); }
        void pushCleanup(void* object, void* (Runnable::*routine)(void*), void* arg);
        // Pops the latest clean-up, running it when execute is not 0; non-zero while more are pushed.
        int popCleanup(int execute) { return primitive_->popCleanup(execute); }

      private:
        KSThread::control* primitive_;
    };

    using Function = void* (*)(control*, void*);
    using Member = void* (Runnable::*)(control*, void*);

    // What a thread runs, on its way to that thread.
    struct Errand {
        Function function;
        void* object;
        Member member;
        void* arg;

        void* run(control* ctl) const;
    };

    // stackSize in octets, 0 for the system's default. The thread is not started. Throws CreationError.
    Thread(Function body, unsigned int stackSize);
    Thread(void* object, Member body, unsigned int stackSize);
    Thread(const Thread&) = delete;
    Thread& operator=(const Thread&) = delete;
    ~Thread() override;

    // Throws AlreadyActive while the thread runs, CreationError when the system refuses one.
    void start(void* arg);
    void cancel();
    void join();
    void* getResult();
    // The thread that runs, or the next one started, is left to run and clean up by itself; this object may
    // go before it and has nothing to say to it any more. May come from the body, while start() has not
    // returned on its own thread; all else that is called here comes from one thread at a time.
    void abandon();

  private:
    Thread(const Errand& errand, unsigned int stackSize);
    void letGo();

    Errand errand_;
    std::unique_ptr<KSThread> thread_;  // null once it is abandoned and runs
    std::atomic<bool> started_{false};  // and not joined since
    std::atomic<bool> abandoned_{false};
    std::atomic<bool> letGo_{false};  // by start() or by abandon(), whichever is first to know of the other
};

// Start a thread that nobody joins; its control is null. Throw Thread::CreationError.
void AbandonedThread_create(Thread::Function body, void* arg, unsigned int stackSize);
void AbandonedThread_create(void* object, Thread::Member body, void* arg, unsigned int stackSize);

}  // namespace vela

#endif
