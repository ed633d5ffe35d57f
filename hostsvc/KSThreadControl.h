// The control that a thread's body gets. Through it the body learns that it must stop, and registers clean-up
// routines.
#ifndef HOSTSVC_KSTHREADCONTROL_H
#define HOSTSVC_KSTHREADCONTROL_H

#include <atomic>
#include <cstdint>
#include <vector>

#include "hostsvc/KSMutex.h"
#include "hostsvc/KSRunnable.h"

// `stopped` means that the thread does not run, or that it has been asked to stop.
enum class KSThreadStatus : std::uint32_t { running = 0, stopped = 1 };

// Also named KSThread::control. The clean-up routines form a stack: the last one pushed is the first to run.
// Only the body uses the stack, and the destructor after the body has ended.
class KSThreadControl {
  public:
    // The control refers to both, which must outlive it. The lock is the one that is locked while the thread
    // runs.
    KSThreadControl(std::atomic<KSThreadStatus>& status, KSMutex& lock) : status_(status), lock_(lock) {}
    KSThreadControl(const KSThreadControl&) = delete;
    KSThreadControl& operator=(const KSThreadControl&) = delete;
    // Runs the routines that are still pushed, and unlocks the lock. Catches what a routine throws.
    ~KSThreadControl();

    // Returns if the status is running. If it is stopped, runs every clean-up routine and ends the calling
    // thread with pthread_exit(NULL). That unwinds the body's frames, so a catch (...) in the body must throw
    // again. The lock is unlocked after the last frame has been left.
    void testCancel();

    void pushCleanup(void* (*routine)(void*), void* arg);
    void pushCleanup(void* object, void* (KSRunnable::*routine)(void*), void* arg);
    // Takes the newest routine off the stack and calls it if execute is not 0. Returns 0 when the stack is
    // empty afterwards. If the routine throws, that is reported on the standard error stream and thrown on.
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
