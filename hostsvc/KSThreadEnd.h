// One act that a thread does at its very end.
#ifndef HOSTSVC_KSTHREADEND_H
#define HOSTSVC_KSTHREADEND_H

// Makes the calling thread call act(object) after its last frame has been left: after its body has returned,
// or after pthread_exit has unwound it. A thread has one such act; later calls of this function are ignored.
void ks_atThreadEnd(void (*act)(void*), void* object);

#endif
