// Threads that nobody joins.
#ifndef HOSTSVC_KSABANDONEDTHREAD_H
#define HOSTSVC_KSABANDONEDTHREAD_H

#include "hostsvc/KSRunnable.h"

// Runs the body with a null control and arg on a new thread; its result is dropped. Returns once the thread
// has taken over what it needs; the object must outlive the body. A stack size of 0 is the system's default,
// one below that is raised to it. Throws KSThread::CreationError.
void KSAbandonedThread_create(void* (*body)(void*, void*), void* arg, unsigned stackSize);
void KSAbandonedThread_create(void* object, void* (KSRunnable::*body)(void*, void*), void* arg,
                              unsigned stackSize);

#endif
