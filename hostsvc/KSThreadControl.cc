#include "hostsvc/KSThreadControl.h"

#include <cxxabi.h>
#include <pthread.h>

#include <iostream>

#include "hostsvc/KSThreadEnd.h"

KSThreadControl::~KSThreadControl() {
    while (!stack_.empty()) {
        try {
            popCleanup(1);
        } catch (...) {  // reported; the routines below it still run
        }
    }
    lock_.unlock();
}

void KSThreadControl::testCancel() {
    if (status_.load() != KSThreadStatus::Stopped)
        return;
    while (popCleanup(1) != 0) {
    }
    // Not here: the frames that pthread_exit unwinds may use what the one who waits for the lock destroys.
    // A KSThread has arranged for it already.
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
        } catch (abi::__forced_unwind&) {  // the routine ends the thread: no error
            throw;
        } catch (...) {
            std::cerr << "ERROR: in ~KSThread::control::popCleanup, cleanup threw exception" << std::endl;
            throw;
        }
    }
    return stack_.empty() ? 0 : 1;
}
