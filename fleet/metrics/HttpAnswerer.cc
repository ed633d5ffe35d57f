#include "fleet/metrics/HttpAnswerer.h"

#include <arpa/inet.h>
#include <netdb.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <deque>
#include <string_view>
#include <utility>
#include <vector>

namespace fleet {

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr milliseconds untilAcceptedAgain{1000};  // when the system has no descriptor for a connection

class Descriptor {
  public:
    explicit Descriptor(int number = -1) : number_(number) {}
    Descriptor(Descriptor&& other) noexcept : number_(std::exchange(other.number_, -1)) {}
    Descriptor& operator=(Descriptor&& other) noexcept {
        std::swap(number_, other.number_);
        return *this;
    }
    ~Descriptor() {
        if (number_ >= 0)
            close(number_);
    }
    int number() const { return number_; }

  private:
    int number_;
};

struct HostAndPort {
    std::string host;
    std::string port;
};

HostAndPort split(const std::string& text) {
    const std::size_t colon = text.rfind(':');
    if (colon == std::string::npos)
        return {"127.0.0.1", text};
    std::string host = text.substr(0, colon);
    if (host.size() > 2 && host.front() == '[' && host.back() == ']')
        host = host.substr(1, host.size() - 2);
    else if (host.find(':') != std::string::npos)
        host.clear();  // an IPv6 address without brackets
    return {host, text.substr(colon + 1)};
}

using Addresses = std::unique_ptr<addrinfo, decltype(&freeaddrinfo)>;

// Null if the text is no address with a port.
Addresses addressesOf(const std::string& text) {
    const auto [host, port] = split(text);
    addrinfo hints{};
    hints.ai_flags = AI_NUMERICHOST | AI_NUMERICSERV | AI_PASSIVE;
    hints.ai_socktype = SOCK_STREAM;
    addrinfo* found = nullptr;
    const bool isPort = !port.empty() && port.size() <= 5 &&
                        std::ranges::all_of(port, [](char c) { return c >= '0' && c <= '9'; }) &&
                        std::stoul(port) <= 65535;
    if (host.empty() || !isPort || getaddrinfo(host.c_str(), port.c_str(), &hints, &found) != 0)
        found = nullptr;
    return {found, freeaddrinfo};
}

Descriptor listenOn(const std::string& text) {
    const Addresses address = addressesOf(text);
    if (!address)
        throw BadListenAddress("\"" + text + "\" is no address to listen on, such as 127.0.0.1:9470");
    Descriptor made(socket(address->ai_family, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
    const int yes = 1;
    if (made.number() < 0 || setsockopt(made.number(), SOL_SOCKET, SO_REUSEADDR, &yes, sizeof yes) != 0 ||
        bind(made.number(), address->ai_addr, address->ai_addrlen) != 0 || listen(made.number(), 16) != 0)
        throw BadListenAddress("cannot listen on " + text + ": " + std::strerror(errno));
    return made;
}

std::string addressOf(const Descriptor& listener) {
    sockaddr_storage address{};
    socklen_t size = sizeof address;
    std::array<char, NI_MAXHOST> host{};
    std::array<char, NI_MAXSERV> port{};
    if (getsockname(listener.number(), reinterpret_cast<sockaddr*>(&address), &size) != 0 ||
        getnameinfo(reinterpret_cast<const sockaddr*>(&address), size, host.data(), host.size(), port.data(),
                    port.size(), NI_NUMERICHOST | NI_NUMERICSERV) != 0)
        return "?";
    const std::string name = host.data();
    return (address.ss_family == AF_INET6 ? "[" + name + "]" : name) + ":" + port.data();
}

struct Request {
    std::string_view method;
    std::string_view path;  // without what follows "?"
    bool isHttp = false;
};

Request requestIn(std::string_view text) {
    const std::string_view line = text.substr(0, text.find_first_of("\r\n"));
    const std::size_t first = line.find(' ');
    const std::size_t second = first == line.npos ? line.npos : line.find(' ', first + 1);
    if (second == line.npos)
        return {};
    const std::string_view target = line.substr(first + 1, second - first - 1);
    return {line.substr(0, first), target.substr(0, target.find('?')),
            line.substr(second + 1).starts_with("HTTP/1.")};
}

// Whether the text contains the empty line that ends a request. The octets before `from` were searched
// before.
bool isWhole(const std::string& text, std::size_t from) {
    const std::size_t begin = from < 3 ? 0 : from - 3;
    return text.find("\r\n\r\n", begin) != text.npos || text.find("\n\n", begin) != text.npos;
}

// `more` are headers, each with its line end.
std::string answer(std::string_view status, std::string_view body, std::string_view more = {}) {
    std::string text("HTTP/1.1 ");
    text.append(status).append("\r\nContent-Length: ").append(std::to_string(body.size()));
    text.append("\r\nConnection: close\r\n").append(more).append("\r\n").append(body);
    return text;
}

std::string answerTo(std::string_view text, const std::function<std::string()>& compose) {
    const Request request = requestIn(text);
    if (!request.isHttp)
        return answer("400 Bad Request", "");
    if (request.method != "GET" && request.method != "HEAD")
        return answer("405 Method Not Allowed", "", "Allow: GET, HEAD\r\n");
    if (request.path != "/metrics")
        return answer("404 Not Found", "metrics are at /metrics\n", "Content-Type: text/plain\r\n");
    try {
        std::string whole =
            answer("200 OK", compose(), "Content-Type: text/plain; version=0.0.4; charset=utf-8\r\n");
        if (request.method == "HEAD")
            whole.erase(whole.find("\r\n\r\n") + 4);
        return whole;
    } catch (const std::exception&) {
        return answer("500 Internal Server Error", "");
    }
}

// Reads a request, writes the answer, and waits until the other end has closed, so that the answer is not
// lost with what it has not read yet.
class Connection {
  public:
    Connection(Descriptor socket, Clock::time_point until) : socket_(std::move(socket)), until_(until) {}

    int number() const { return socket_.number(); }
    Clock::time_point until() const { return until_; }
    bool isOver(Clock::time_point now) const { return isOver_ || until_ <= now; }
    std::int16_t waitsFor() const { return out_.size() > written_ ? POLLOUT : POLLIN; }

    // Does what can be done without waiting. `most` is the longest request that is read.
    void go(const std::function<std::string()>& compose, std::size_t most) {
        const bool isAnswered = !out_.empty() && written_ == out_.size();
        isOver_ = !(isAnswered ? drain(most) : exchange(compose, most));
    }

  private:
    bool exchange(const std::function<std::string()>& compose, std::size_t most) {
        if (out_.empty() && !read(compose, most))
            return false;
        while (written_ < out_.size()) {
            const ssize_t sent =
                send(number(), out_.data() + written_, out_.size() - written_, MSG_NOSIGNAL | MSG_DONTWAIT);
            if (sent < 0)
                return errno == EAGAIN || errno == EINTR;
            written_ += static_cast<std::size_t>(sent);
        }
        return out_.empty() || shutdown(number(), SHUT_WR) == 0;
    }

    bool read(const std::function<std::string()>& compose, std::size_t most) {
        std::array<char, 2048> part{};
        const ssize_t got = recv(number(), part.data(), part.size(), MSG_DONTWAIT);
        if (got <= 0)
            return got < 0 && (errno == EAGAIN || errno == EINTR);
        const std::size_t before = in_.size();
        in_.append(part.data(), static_cast<std::size_t>(got));
        if (isWhole(in_, before))
            out_ = answerTo(in_, compose);
        else if (in_.size() >= most)
            out_ = answer("431 Request Header Fields Too Large", "");
        return true;
    }

    bool drain(std::size_t most) {
        std::array<char, 2048> part{};
        const ssize_t got = recv(number(), part.data(), part.size(), MSG_DONTWAIT);
        if (got > 0)
            drained_ += static_cast<std::size_t>(got);
        return drained_ <= 8 * most && (got > 0 || (got < 0 && (errno == EAGAIN || errno == EINTR)));
    }

    Descriptor socket_;
    Clock::time_point until_;
    std::string in_;
    std::string out_;
    std::size_t written_ = 0;
    std::size_t drained_ = 0;
    bool isOver_ = false;
};

}  // namespace

class HttpAnswerer::Loop {
  public:
    Loop(const std::string& address, std::function<std::string()> compose, const HttpLimits& limits)
        : listener_(listenOn(address)),
          wake_(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)),
          compose_(std::move(compose)),
          limits_(limits) {
        if (wake_.number() < 0)
            throw BadListenAddress("cannot listen on " + address + ": " + std::strerror(errno));
    }

    std::string address() const { return addressOf(listener_); }

    void run(const std::stop_token& stop) {
        while (!stop.stop_requested()) {
            const std::vector<pollfd> polled = waitForSomething();
            for (std::size_t i = 0; i < connections_.size(); ++i) {
                if (polled[i + 2].revents != 0)
                    connections_[i].go(compose_, limits_.mostOctets);
            }
            const Clock::time_point now = Clock::now();
            std::erase_if(connections_, [&](const Connection& each) { return each.isOver(now); });
            if (polled[1].revents != 0)
                accept(now);
        }
    }

    void wake() { eventfd_write(wake_.number(), 1); }

  private:
    // The first descriptor wakes the thread, the second one listens, and those of the connections follow.
    std::vector<pollfd> waitForSomething() {
        const Clock::time_point now = Clock::now();
        Clock::time_point until = Clock::time_point::max();
        std::vector<pollfd> polled{{wake_.number(), POLLIN, 0}, {listener_.number(), POLLIN, 0}};
        if (now < deafUntil_) {
            polled[1].fd = -1;
            until = deafUntil_;
        }
        for (const Connection& connection : connections_) {
            polled.push_back({connection.number(), connection.waitsFor(), 0});
            until = std::min(until, connection.until());
        }
        const auto left = std::chrono::ceil<milliseconds>(std::max(until - now, Clock::duration::zero()));
        const int wait = until == Clock::time_point::max() ? -1 : static_cast<int>(left.count());
        if (poll(polled.data(), polled.size(), wait) < 0) {
            for (pollfd& each : polled)
                each.revents = 0;
        }
        return polled;
    }

    void accept(Clock::time_point now) {
        Descriptor socket(accept4(listener_.number(), nullptr, nullptr, SOCK_NONBLOCK | SOCK_CLOEXEC));
        if (socket.number() < 0) {
            if (errno == EMFILE || errno == ENFILE || errno == ENOBUFS || errno == ENOMEM)
                deafUntil_ = now + untilAcceptedAgain;
            return;
        }
        if (connections_.size() >= limits_.mostConnections)
            connections_.pop_front();
        connections_.emplace_back(std::move(socket), now + limits_.patience);
    }

    Descriptor listener_;
    Descriptor wake_;
    std::function<std::string()> compose_;
    HttpLimits limits_;
    std::deque<Connection> connections_;  // the oldest first
    Clock::time_point deafUntil_{};
};

bool isListenAddress(const std::string& text) { return addressesOf(text) != nullptr; }

HttpAnswerer::HttpAnswerer(const std::string& address, std::function<std::string()> compose,
                           const HttpLimits& limits)
    : loop_(std::make_unique<Loop>(address, std::move(compose), limits)),
      address_(loop_->address()),
      thread_([this](const std::stop_token& stop) { loop_->run(stop); }) {}

HttpAnswerer::~HttpAnswerer() {
    thread_.request_stop();
    loop_->wake();
    thread_.join();
}

}  // namespace fleet
