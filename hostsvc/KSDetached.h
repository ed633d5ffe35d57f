// Creates the threads of the layer. All of them are detached.
#ifndef HOSTSVC_KSDETACHED_H
#define HOSTSVC_KSDETACHED_H

// Starts a detached thread that calls entry(argument). Returns false when the system refuses it. A stack size
// of 0 means the system's default. A size below the default is raised to it, and stackSize is set to that
// size.
bool ks_startDetached(void* (*entry)(void*), void* argument, unsigned& stackSize);

#endif
