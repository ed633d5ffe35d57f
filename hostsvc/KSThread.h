// A thread that can be waited for, asked to stop and started again.
#ifndef HOSTSVC_KSTHREAD_H
#define HOSTSVC_KSTHREAD_H

#include <atomic>

#include "hostsvc/KSException.h"
#include "hostsvc/KSMutex.h"
#include "hostsvc/KSRunnable.h"
#include "hostsvc/KSThreadControl.h"

// The entry function of every KSThread. `thread` is the KSThread object whose body it runs on the new thread.
void* KSThread_run(void* thread);

// Cancellation is cooperative: cancel() sets the status, and the body ends the next time it calls
// control::testCancel().
//
// start() locks the thread's lock. The started thread unlocks it as the last thing it does with the object,
// however its body ends. So whoever gets the lock, as join() does, may destroy the object.
class KSThread {
  public:
    class Exception : public virtual KSException {};
    class CreationError : public Exception, public KSResource_CreationError {};
    class AlreadyActive : public Exception {};

    using ThreadStatus = KSThreadStatus;
    using control = KSThreadControl;

    // Makes a stopped thread, which start() starts. A stack size of 0 means the system's default; a smaller
    // size is raised to the default. The body is called with the control (see setControl) and the argument of
    // start(). The body's object must outlive the thread.
    KSThread(void* (*body)(void*, void*), unsigned stackSize);
    KSThread(void* object, void* (KSRunnable::*body)(void*, void*), unsigned stackSize);
    KSThread(const KSThread&) = delete;
    KSThread& operator=(const KSThread&) = delete;
    // Cancels and joins the thread, then runs the routines that are left on the clean-up stack.
    virtual ~KSThread();

    // Starts the thread. If it was cancelled but has not ended yet, waits for its end first. Throws
    // AlreadyActive when it is running, CreationError when the system refuses the thread.
    void start(void* arg);
    void run();  // runs the body; called on the started thread
    void cancel();
    // Waits until the started thread does not touch the object any more. Returns at once if none was started.
    void join();
    // The same for a limited time. Returns false when the thread still runs then.
    bool tryJoin(unsigned timeoutMs, unsigned intervalMs);
    // The result of the body. Null until the body has returned, and if it ended in another way.
    void* getResult() const;
    // Makes the object delete itself when its body ends; it must have been made with new, and the caller must
    // not use it any more. If the body of the last start has ended already and nobody has joined the thread,
    // deletes the object now.
    void abandon();

    // The first argument of the body is the thread's own control, unless setControl has set another pointer.
    control* getControl() { return &control_; }
    void setControl(void* handed) { handedControl_ = handed; }

  private:
    // `ended`: the body has ended, and no thread has joined it yet.
    enum Life : unsigned { abandoned = 1, ended = 2 };

    KSThread(const KSBody& body, unsigned stackSize);
    friend void* KSThread_run(void* thread);
    static void finish(void* thread);

    std::atomic<ThreadStatus> status_{ThreadStatus::stopped};
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
