#include "relay/notify.h"

#include <sys/socket.h>
#include <sys/un.h>

#include <cstddef>
#include <cstdlib>
#include <cstring>

#include "relay/descriptor.h"

namespace relay {

void notify(const std::string& state) {
    const char* const path = std::getenv("NOTIFY_SOCKET");
    sockaddr_un address{};
    if (path == nullptr || (*path != '/' && *path != '@') || std::strlen(path) >= sizeof address.sun_path)
        return;
    const std::size_t length = std::strlen(path);
    address.sun_family = AF_UNIX;
    std::memcpy(address.sun_path, path, length);
    if (*path == '@')
        address.sun_path[0] = '\0';  // an abstract name instead of a file
    const Descriptor socket(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    sendto(socket.get(), state.data(), state.size(), MSG_NOSIGNAL,
           reinterpret_cast<const sockaddr*>(&address),
           static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + length));
}

}  // namespace relay
