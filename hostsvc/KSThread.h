// A thread that can be waited for, asked to stop and started again.
#ifndef HOSTSVC_KSTHREAD_H
#define HOSTSVC_KSTHREAD_H

#include <atomic>

#include "hostsvc/KSException.h"
#include "hostsvc/KSMutex.h"
#include "hostsvc/KSRunnable.h"
#include "hostsvc/KSThreadControl.h"

// The entry function of every KSThread: runs the thread object that it is given on the new thread.
void* KSThread_run(void* thread);

// Cancellation is cooperative: cancel() sets the status, and the body ends at its next control::testCancel().
// The lock is held from start() until the started thread touches the object no more, whichever way its body
// ends; then it is unlocked, once for each start, as the thread's very last act on the object.
class KSThread {
  public:
    class Exception : public virtual KSException {};
    class CreationError : public Exception, public KSResource_CreationError {};
    class AlreadyActive : public Exception {};

    using ThreadStatus = KSThreadStatus;
    using control = KSThreadControl;

    // Stopped; start() starts it. A stack size of 0 is the system's default, one below that is raised to it.
    // The body is called with the control (see setControl) and the start argument; its object must outlive
    // it.
    KSThread(void* (*body)(void*, void*), unsigned stackSize);
    KSThread(void* object, void* (KSRunnable::*body)(void*, void*), unsigned stackSize);
    KSThread(const KSThread&) = delete;
    KSThread& operator=(const KSThread&) = delete;
    // Cancels and joins, then runs what is left on the clean-up stack.
    virtual ~KSThread();

    // Throws AlreadyActive unless stopped, CreationError when the system refuses. When the thread has been
    // cancelled but has not noticed yet, waits until it has ended.
    void start(void* arg);
    void run();  // the body runner, on the started thread
    void cancel();
    // Waits until the started thread touches the object no more; returns at once when none was started.
    void join();
    // The same for a bounded time, polled; false when the thread still runs.
    bool tryJoin(unsigned timeoutMs, unsigned intervalMs);
    // What the body returned; null after a start until then, and when it did not return normally.
    void* getResult() const;
    // Gives the object away, which must have been made with new: it deletes itself when its body ends. Where
    // the body of the last start has ended already and nobody has joined it, that is now.
    void abandon();

    // What the body gets as its first argument: the thread's own control unless another pointer is set.
    control* getControl() { return &control_; }
    void setControl(void* handed) { handedControl_ = handed; }

  private:
    enum Life : unsigned { Abandoned = 1, Ended = 2 };  // Ended: since the last start, and not yet joined

    KSThread(const KSBody& body, unsigned stackSize);
    friend void* KSThread_run(void* thread);
    static void finish(void* thread);

    std::atomic<ThreadStatus> status_{ThreadStatus::Stopped};
    KSBody body_;
    void* argument_ = nullptr;
    std::atomic<void*> result_{nullptr};
    KSMutex lock_;
    unsigned stackSize_;
    std::atomic<unsigned> life_{0};
    control control_;
    void* handedControl_;
};

#endif
