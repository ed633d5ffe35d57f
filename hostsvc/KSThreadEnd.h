// What a thread still owes at its very end.
#ifndef HOSTSVC_KSTHREADEND_H
#define HOSTSVC_KSTHREADEND_H

// Calls act(object) when the calling thread's last frame is gone: after the body has returned, or after
// pthread_exit has unwound it. Each thread has one such act; a second one is not taken.
void ks_atThreadEnd(void (*act)(void*), void* object);

#endif
