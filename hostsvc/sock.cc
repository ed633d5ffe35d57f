#include "hostsvc/sock.h"

#include <arpa/inet.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <iostream>
#include <string>
#include <utility>

#include "hostsvc/hostnames.h"

namespace {

constexpr long forEver = -1;

short eventsOf(char mode) {
    switch (mode) {
        case 'r':
            return POLLIN;
        case 'w':
            return POLLOUT;
        case 'e':
            return POLLPRI;
        default:
            return 0;
    }
}

// The poll events that count as ready. A connection that has ended or failed counts as ready as well: reading
// or writing it then shows the failure.
short shownBy(short events) {
    return static_cast<short>(events == POLLPRI ? events | POLLNVAL : events | POLLNVAL | POLLERR | POLLHUP);
}

}  // namespace

sock::sock(int fd) : descriptor_(fd) {}

sock::sock(int fd, const sockaddr_in& addr) : address_(addr), descriptor_(fd) {}

sock::sock(unsigned long addr, int port) { sock_make(addr, port); }

sock::sock(const char* host, int port) {
    std::string name(host);
    for (std::size_t colon = name.find(':'); colon != std::string::npos; colon = name.find(':', colon + 1))
        port = stn(name.c_str() + colon + 1);
    name.resize(std::min(name.find(':'), name.size()));
    if (is_dn(name.c_str()) != 0) {
        std::array<char, INET_ADDRSTRLEN> address{};
        dntoip(address.data(), name.c_str());
        name = address.data();
        if (name.empty()) {
            error_ = 1;
            return;
        }
    }
    sock_make(inet_addr(name.c_str()), port);
}

sock::~sock() {
    if (descriptor_ == 0)
        return;
    if (failed())
        ::close(descriptor_);
    else
        close();
}

void sock::sock_make(unsigned long addr, int port) {
    descriptor_ = ::socket(AF_INET, SOCK_STREAM, 0);
    if (descriptor_ < 0)
        error_ = 1;
    address_ = {};
    address_.sin_family = AF_INET;
    address_.sin_addr.s_addr = static_cast<in_addr_t>(addr);
    address_.sin_port = htons(static_cast<std::uint16_t>(port));
}

int sock::close() {
    const linger atOnce{1, 0};
    if (setsockopt(descriptor_, SOL_SOCKET, SO_LINGER, &atOnce, sizeof atOnce) != 0)
        std::cerr << "Unable to flush socket data, socket may remain open on " << descriptor_ << std::endl;
    return ::close(std::exchange(descriptor_, 0));
}

int sock::shutdown(int how) const { return ::shutdown(descriptor_, how); }

int sock::bind() const {
    return ::bind(descriptor_, reinterpret_cast<const sockaddr*>(&address_), sizeof address_);
}

int sock::listen(int backlog) const { return ::listen(descriptor_, backlog); }

int sock::accept(sockaddr_in& peer) const {
    socklen_t size = sizeof peer;
    return ::accept(descriptor_, reinterpret_cast<sockaddr*>(&peer), &size);
}

int sock::accept() const {
    sockaddr_in dropped{};
    return accept(dropped);
}

int sock::connect() {
    const int result = ::connect(descriptor_, reinterpret_cast<const sockaddr*>(&address_), sizeof address_);
    if (result < 0)
        error_ = 1;
    return result;
}

// Uses ppoll, because select cannot wait for descriptors above 1023. When ppoll fails, the result is 1, as
// select would leave the descriptor in its set.
int sock::ready(char mode, long sec, long usec) const {
    const short events = eventsOf(mode);
    const bool waits = sec == forEver && usec == forEver;
    if (events == 0 || descriptor_ < 0 || (!waits && (sec < 0 || usec < 0)))
        return 1;
    const timespec timeout{sec + usec / 1000000, usec % 1000000 * 1000};
    pollfd waited{descriptor_, events, 0};
    if (ppoll(&waited, 1, waits ? nullptr : &timeout, nullptr) < 0)
        return 1;
    return (waited.revents & shownBy(events)) != 0 ? 1 : 0;
}

// `count` is the result of recv or send. Sets the error flag for an error or when the peer has closed.
long sock::transferred(long count) {
    if (count <= 0)
        error_ = 1;
    return count;
}

long sock::readblock(void* buf, long len) {
    auto* to = static_cast<char*>(buf);
    while (len > 0) {
        if (ready('r', forEver, forEver) == 0)
            continue;
        const long count = transferred(::recv(descriptor_, to, static_cast<std::size_t>(len), 0));
        if (count <= 0)
            return count < 0 ? count : len;
        to += count;
        len -= count;
    }
    return len;
}

long sock::writeblock(const void* buf, long len) {
    const auto* from = static_cast<const char*>(buf);
    while (len > 0) {
        if (ready('w', forEver, forEver) == 0)
            continue;
        // MSG_NOSIGNAL: a peer that has closed must not end the process with a signal.
        const long count =
            transferred(::send(descriptor_, from, static_cast<std::size_t>(len), MSG_NOSIGNAL));
        if (count <= 0)
            return count;
        from += count;
        len -= count;
    }
    return len;
}
