// How the threads of the layer begin and end. All of them are detached.
#ifndef HOSTSVC_KSDETACHED_H
#define HOSTSVC_KSDETACHED_H

// Starts a detached thread that calls entry(argument). Returns false when the system refuses it. A stack size
// of 0 means the system's default. A size below the default is raised to it, and stackSize is set to that
// size.
bool ks_startDetached(void* (*entry)(void*), void* argument, unsigned& stackSize);

// Makes the calling thread call act(object) after its last frame has been left: after its body has returned,
// or after pthread_exit has unwound it. A thread has one such act; later calls of this function are ignored.
void ks_atThreadEnd(void (*act)(void*), void* object);

#endif
