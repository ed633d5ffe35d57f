// Start-up and shut-down of the host services.
#ifndef HOSTSVC_KSHOST_H
#define HOSTSVC_KSHOST_H

#include <cstdint>

// Call it once, before any queue is made. Returns the transport library's status, 0 for success.
std::uint32_t KSHostInit();

// Call it once, at the end.
void KSHostCleanup();

#endif
