// What a thread's body sees of its thread: the request to stop, and its stack of clean-up routines.
#ifndef HOSTSVC_KSTHREADCONTROL_H
#define HOSTSVC_KSTHREADCONTROL_H

#include <atomic>
#include <cstdint>
#include <vector>

#include "hostsvc/KSMutex.h"
#include "hostsvc/KSRunnable.h"

// Stopped stands for both "does not run" and "has been asked to stop".
enum class KSThreadStatus : std::uint32_t { Running = 0, Stopped = 1 };

// Known as KSThread::control. The clean-up stack, last in first out, belongs to the body, and to whoever
// destroys the control once the body has ended.
class KSThreadControl {
  public:
    // Both outlive the control. The lock is the one that is held while the thread runs.
    KSThreadControl(std::atomic<KSThreadStatus>& status, KSMutex& lock) : status_(status), lock_(lock) {}
    KSThreadControl(const KSThreadControl&) = delete;
    KSThreadControl& operator=(const KSThreadControl&) = delete;
    // Runs what is still pushed, and unlocks the lock. What a routine throws ends here.
    ~KSThreadControl();

    // Returns while the status is running. Once it is stopped: runs every clean-up routine and ends the
    // calling thread with pthread_exit(NULL), which unwinds the body's frames, so a catch (...) on the way
    // must rethrow. The lock is unlocked after the last frame.
    void testCancel();

    void pushCleanup(void* (*routine)(void*), void* arg);
    void pushCleanup(void* object, void* (KSRunnable::*routine)(void*), void* arg);
    // Takes the newest routine off the stack, calls it when execute is not 0, and tells (not 0) whether there
    // are more. What the routine throws is reported on the standard error stream and passed on.
    int popCleanup(int execute);

  private:
    struct Node {
        KSCleanup routine;
        void* argument;
    };

    std::atomic<KSThreadStatus>& status_;
    KSMutex& lock_;
    std::vector<Node> stack_;
};

#endif
