#include "hostsvc/KSThreadControl.h"

#include <cxxabi.h>
#include <pthread.h>

#include <iostream>

#include "hostsvc/KSDetached.h"

KSThreadControl::~KSThreadControl() {
    while (!stack_.empty()) {
        try {
            popCleanup(1);
        } catch (...) {  // popCleanup has reported it; the other routines must run as well
        }
    }
    lock_.unlock();
}

void KSThreadControl::testCancel() {
    if (status_.load() != KSThreadStatus::stopped)
        return;
    while (popCleanup(1) != 0) {
    }
    // The lock must not be unlocked here: pthread_exit still unwinds frames that may use what a thread that
    // waits for the lock then destroys. If a KSThread runs the body, it has already set an act for the
    // thread's end, and this one is ignored.
    ks_atThreadEnd([](void* lock) { static_cast<KSMutex*>(lock)->unlock(); }, &lock_);
    pthread_exit(nullptr);
}

void KSThreadControl::pushCleanup(void* (*routine)(void*), void* arg) {
    stack_.push_back({KSCleanup(routine), arg});
}

void KSThreadControl::pushCleanup(void* object, void* (KSRunnable::*routine)(void*), void* arg) {
    stack_.push_back({KSCleanup(object, routine), arg});
}

int KSThreadControl::popCleanup(int execute) {
    if (stack_.empty())
        return 0;
    const Node top = stack_.back();
    stack_.pop_back();
    if (execute != 0) {
        try {
            top.routine(top.argument);
        } catch (abi::__forced_unwind&) {  // the routine ends the thread, which is no error
            throw;
        } catch (...) {
            std::cerr << "ERROR: in ~KSThread::control::popCleanup, cleanup threw exception" << std::endl;
            throw;
        }
    }
    return stack_.empty() ? 0 : 1;
}
