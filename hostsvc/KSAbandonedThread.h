// Starts threads that nobody joins.
#ifndef HOSTSVC_KSABANDONEDTHREAD_H
#define HOSTSVC_KSABANDONEDTHREAD_H

#include "hostsvc/KSRunnable.h"

// Runs the body on a new thread, with a null control and arg. The body's result is ignored. Returns once the
// new thread has copied what it needs. The object must outlive the body. A stack size of 0 means the system's
// default; a smaller size is raised to the default. Throws KSThread::CreationError when the system refuses
// the thread.
void KSAbandonedThread_create(void* (*body)(void*, void*), void* arg, unsigned stackSize);
void KSAbandonedThread_create(void* object, void* (KSRunnable::*body)(void*, void*), void* arg,
                              unsigned stackSize);

#endif
