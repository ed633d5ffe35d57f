// Detached threads: how every thread of the layer is made.
#ifndef HOSTSVC_KSDETACHED_H
#define HOSTSVC_KSDETACHED_H

// Starts a detached thread at entry(argument) and tells whether there is one. A stack size of 0 is the
// system's default; one below the default is raised to it, in stackSize too.
bool ks_startDetached(void* (*entry)(void*), void* argument, unsigned& stackSize);

#endif
