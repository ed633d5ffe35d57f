#include "service/notify.h"

#include <sys/socket.h>
#include <sys/time.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <charconv>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string_view>

namespace service {

namespace {

class Socket {
  public:
    Socket() : number_(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0)) {}
    ~Socket() {
        if (number_ >= 0)
            close(number_);
    }
    Socket(const Socket&) = delete;
    Socket& operator=(const Socket&) = delete;
    int number() const { return number_; }

  private:
    int number_;
};

std::optional<std::uint64_t> numberIn(const char* name) {
    const char* const value = std::getenv(name);
    if (value == nullptr)
        return {};
    const std::string_view text = value;
    std::uint64_t number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size())
        return {};
    return number;
}

// Returns whether the service manager has the line, or nobody wants it. Waits at most `patience`, or not at
// all, for a service manager whose socket is full.
bool sent(std::string_view line, std::chrono::seconds patience) {
    const char* const path = std::getenv("NOTIFY_SOCKET");
    sockaddr_un address{};
    if (path == nullptr || (*path != '/' && *path != '@') || std::strlen(path) >= sizeof address.sun_path)
        return true;
    const std::size_t length = std::strlen(path);
    address.sun_family = AF_UNIX;
    std::memcpy(address.sun_path, path, length);
    if (*path == '@')
        address.sun_path[0] = '\0';  // an abstract name instead of a file
    const Socket socket;
    const timeval limit{patience.count(), 0};
    setsockopt(socket.number(), SOL_SOCKET, SO_SNDTIMEO, &limit, sizeof limit);
    const int waits = patience.count() == 0 ? MSG_DONTWAIT : 0;
    return sendto(socket.number(), line.data(), line.size(), MSG_NOSIGNAL | waits,
                  reinterpret_cast<const sockaddr*>(&address),
                  static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + length)) >= 0;
}

}  // namespace

void notify(const std::string& line) { sent(line, std::chrono::seconds(1)); }

Heartbeat::Heartbeat() {
    constexpr unsigned beats = 3;
    constexpr std::uint64_t day = 86'400'000'000;  // microseconds; a longer time is as good as this one
    const auto allowed = numberIn("WATCHDOG_USEC");
    const auto watched = numberIn("WATCHDOG_PID");
    if (!allowed || *allowed == 0 || (watched && *watched != static_cast<std::uint64_t>(getpid())))
        return;
    const std::uint64_t each = std::min(*allowed, day) / beats / 1000;
    interval_ = std::chrono::milliseconds(std::max<std::uint64_t>(each, 1));
}

void Heartbeat::beat() {
    if (!interval_)
        return;
    const Clock::time_point now = Clock::now();
    if (last_ != Clock::time_point::min() && now - last_ < *interval_ / 2)
        return;
    if (sent("WATCHDOG=1", {}))
        last_ = now;
}

}  // namespace service
