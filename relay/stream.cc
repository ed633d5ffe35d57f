#include "relay/stream.h"

#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <string>

#include "relay/ended.h"

namespace relay {

namespace {

using Clock = std::chrono::steady_clock;

constexpr int forEver = -1;

// The time until the deadline in milliseconds, rounded up, as poll takes it.
int left(Clock::time_point deadline) {
    const auto rest = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now());
    return static_cast<int>(std::clamp<std::int64_t>(rest.count(), 0, 3600000));
}

// Waits until the socket is ready. Returns false when the time is over.
bool await(int socket, short events, int timeoutMs) {
    pollfd waited{socket, events, 0};
    int result = 0;
    while ((result = poll(&waited, 1, timeoutMs)) < 0 && errno == EINTR) {
    }
    return result != 0;
}

std::string lasting(std::chrono::milliseconds time) { return std::to_string(time.count()) + " ms"; }

}  // namespace

// TCP_NODELAY, because frames are small and somebody waits for them. The other options notice a host that has
// disappeared: keep-alive while nothing is on its way to the host, and the user time-out while something is,
// because keep-alive does not work then.
Stream::Stream(Descriptor socket, Patience patience) : socket_(std::move(socket)), patience_(patience) {
    const auto userTimeout = static_cast<int>(std::max<std::int64_t>(60000, patience.write.count()));
    const struct {
        int level, option, value;
    } options[] = {{IPPROTO_TCP, TCP_NODELAY, 1},   {SOL_SOCKET, SO_KEEPALIVE, 1},
                   {IPPROTO_TCP, TCP_KEEPIDLE, 30}, {IPPROTO_TCP, TCP_KEEPINTVL, 10},
                   {IPPROTO_TCP, TCP_KEEPCNT, 3},   {IPPROTO_TCP, TCP_USER_TIMEOUT, userTimeout}};
    for (const auto& each : options)
        setsockopt(socket_.get(), each.level, each.option, &each.value, sizeof each.value);
}

Frame Stream::readFrame() {
    await(socket_.get(), POLLIN, forEver);
    return readRest(Clock::now() + patience_.frame);
}

Frame Stream::readFirstFrame() { return readRest(Clock::now() + patience_.frame); }

Frame Stream::readRest(Time deadline) {
    std::array<std::uint8_t, frameHeaderSize> header{};
    read(header, deadline);
    Frame frame;
    frame.header = FrameHeader::parse(header);
    frame.data.resize(frame.header.dataSize);
    frame.extra.resize(frame.header.extraSize);
    read(frame.data, deadline);
    read(frame.extra, deadline);
    return frame;
}

void Stream::read(std::span<std::uint8_t> into, Time deadline) {
    while (!into.empty()) {
        if (!await(socket_.get(), POLLIN, left(deadline)))
            throw Ended("no whole frame within " + lasting(patience_.frame));
        const ssize_t count = recv(socket_.get(), into.data(), into.size(), MSG_DONTWAIT);
        if (count == 0)
            throw Ended("the connection was closed");
        if (count > 0)
            into = into.subspan(static_cast<std::size_t>(count));
        else if (errno != EAGAIN && errno != EINTR)
            throw Ended(std::string("the connection failed: ") + std::strerror(errno));
    }
}

void Stream::write(std::span<const std::uint8_t> octets) {
    const Time deadline = Clock::now() + patience_.write;
    while (!octets.empty()) {
        const ssize_t count = send(socket_.get(), octets.data(), octets.size(), MSG_DONTWAIT | MSG_NOSIGNAL);
        if (count >= 0)
            octets = octets.subspan(static_cast<std::size_t>(count));
        else if (errno != EAGAIN && errno != EINTR)
            throw Ended(std::string("the connection failed: ") + std::strerror(errno));
        else if (!await(socket_.get(), POLLOUT, left(deadline)))
            throw Ended("a frame was not taken within " + lasting(patience_.write));
    }
}

void Stream::shutDownReading() { shutdown(socket_.get(), SHUT_RD); }

void Stream::shutDown() { shutdown(socket_.get(), SHUT_RDWR); }

}  // namespace relay
