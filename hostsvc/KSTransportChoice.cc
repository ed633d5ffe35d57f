#include "hostsvc/KSTransportChoice.h"

#include <cstdlib>
#include <cstring>

#include "hostsvc/KSLocalMsgQueue.h"
#include "hostsvc/KSRemoteMsgQueue.h"

const char* ks_chooseHost(const char* hostName, const char* remoteNorv, const char* host) {
    const char* const named = hostName != nullptr ? hostName : remoteNorv;
    if (named != nullptr && host != nullptr && std::strncmp(named, host, std::strlen(host)) == 0)
        return nullptr;
    return named;
}

std::unique_ptr<KSAbstractMsgQueue> ks_openTransport(NvCompDesc desc, unsigned a, unsigned b,
                                                     const char* hostName) {
    const char* const chosen = ks_chooseHost(hostName, std::getenv("REMOTE_NORV"), std::getenv("HOST"));
    if (chosen == nullptr)
        return std::make_unique<KSLocalMsgQueue>(desc, a, b);
    return std::make_unique<KSRemoteMsgQueue>(desc, a, b, chosen);
}
