// Which transport a host queue runs over: the one place that knows.
#ifndef HOSTSVC_KSTRANSPORTCHOICE_H
#define HOSTSVC_KSTRANSPORTCHOICE_H

#include <memory>

#include "hostsvc/KSAbstractMsgQueue.h"

// The machine to reach the board through, or null for the transport library on this one. A host name (given,
// or else REMOTE_NORV) that begins with this machine's own, HOST, is this machine: a prefix is enough. Any of
// the three may be null.
const char* ks_chooseHost(const char* hostName, const char* remoteNorv, const char* host);

// Opens the queue that hostName and the environment (REMOTE_NORV, HOST) ask for. Throws
// KSResource_CreationError.
std::unique_ptr<KSAbstractMsgQueue> ks_openTransport(NvCompDesc desc, unsigned a, unsigned b,
                                                     const char* hostName);

#endif
