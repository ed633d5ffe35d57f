// Bodies and clean-up routines as lambdas.
#ifndef TESTS_HOSTSVC_STORY_H
#define TESTS_HOSTSVC_STORY_H

#include <sched.h>

#include <functional>

#include "hostsvc/KSThread.h"

// The start argument of a thread that runs tell().
using Story = std::function<void*(KSThread::control&)>;

inline void* tell(void* control, void* story) {
    return (*static_cast<Story*>(story))(*static_cast<KSThread::control*>(control));
}

// The argument of a clean-up routine that runs act().
using Act = std::function<void()>;

inline void* act(void* what) {
    (*static_cast<Act*>(what))();
    return nullptr;
}

inline void* goOnUntilCancelled(KSThread::control& control) {
    for (;;) {
        control.testCancel();
        sched_yield();
    }
}

inline Story untilCancelled = goOnUntilCancelled;

#endif
