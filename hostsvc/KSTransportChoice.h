// Decides whether a host queue is in this machine or behind a relay.
#ifndef HOSTSVC_KSTRANSPORTCHOICE_H
#define HOSTSVC_KSTRANSPORTCHOICE_H

#include <memory>

#include "hostsvc/KSAbstractMsgQueue.h"

// Returns the relay's machine, or null for the transport library in this machine. The machine is hostName, or
// if that is null, the value of REMOTE_NORV. If it begins with the value of HOST, the name of this machine,
// the result is null. Each of the three may be null.
const char* ks_chooseHost(const char* hostName, const char* remoteNorv, const char* host);

// Opens a queue in the machine that hostName and the environment (REMOTE_NORV, HOST) name. Throws
// KSResource_CreationError.
std::unique_ptr<KSAbstractMsgQueue> ks_openTransport(NvCompDesc desc, unsigned a, unsigned b,
                                                     const char* hostName);

#endif
