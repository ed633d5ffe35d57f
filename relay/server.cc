#include "relay/server.h"

#include <netinet/in.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <string>
#include <system_error>

namespace relay {

namespace {

constexpr int forEver = -1;
constexpr int retryMs = 1000;  // how long to wait after the system had no descriptor for a connection

[[noreturn]] void fail(const std::string& what) {
    throw std::system_error(errno, std::generic_category(), what);
}

sockaddr_in addressOf(const Endpoint& endpoint) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(endpoint.address);
    address.sin_port = htons(endpoint.port);
    return address;
}

Endpoint endpointOf(const sockaddr_in& address) {
    return {ntohl(address.sin_addr.s_addr), ntohs(address.sin_port)};
}

Descriptor listenAt(const Endpoint& endpoint) {
    Descriptor socket(::socket(AF_INET, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
    const int on = 1;
    setsockopt(socket.get(), SOL_SOCKET, SO_REUSEADDR, &on, sizeof on);
    const sockaddr_in address = addressOf(endpoint);
    if (bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0 ||
        listen(socket.get(), SOMAXCONN) != 0)
        fail("listening on " + endpoint.text());
    return socket;
}

void empty(int descriptor) {
    std::array<char, 1024> dropped{};
    static_cast<void>(!read(descriptor, dropped.data(), dropped.size()));
}

}  // namespace

Server::Server(const Options& options, Log log)
    : options_(options),
      log_(std::move(log)),
      listener_(listenAt(options.listen)),
      ended_(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
    if (options_.allow.empty())
        options_.allow.push_back(loopback);
    if (ended_.get() < 0)
        fail("making an event counter");
}

Server::~Server() = default;

Endpoint Server::endpoint() const {
    sockaddr_in address{};
    socklen_t size = sizeof address;
    getsockname(listener_.get(), reinterpret_cast<sockaddr*>(&address), &size);
    return endpointOf(address);
}

void Server::run(int stop, const std::function<void()>& stopping) {
    while (!stopped_)
        awaitChange(stop, full_ ? retryMs : forEver);
    stopping();
    drain(stop);
}

// The earlier of a timeout of poll() and the next beat.
int Server::orNextBeat(int timeoutMs) const {
    const auto interval = heartbeat_.interval();
    if (!interval)
        return timeoutMs;
    const auto beatMs = static_cast<int>(interval->count());
    return timeoutMs == forEver ? beatMs : std::min(timeoutMs, beatMs);
}

// Waits for a new connection, for the end of one, or for `stop`, and deals with it.
void Server::awaitChange(int stop, int timeoutMs) {
    std::array<pollfd, 3> waited{pollfd{stop, POLLIN, 0}, pollfd{ended_.get(), POLLIN, 0},
                                 pollfd{full_ ? -1 : listener_.get(), POLLIN, 0}};
    full_ = false;
    heartbeat_.beat();
    if (poll(waited.data(), waited.size(), orNextBeat(timeoutMs)) < 0)
        return;
    if (waited[0].revents != 0) {
        empty(stop);
        stopped_ = true;
    }
    if (waited[1].revents != 0)
        reap();
    if (waited[2].revents != 0)
        accept();
}

void Server::accept() try {
    sockaddr_in peer{};
    socklen_t size = sizeof peer;
    Descriptor socket(
        accept4(listener_.get(), reinterpret_cast<sockaddr*>(&peer), &size, SOCK_NONBLOCK | SOCK_CLOEXEC));
    if (socket.get() < 0) {
        full_ = errno == EMFILE || errno == ENFILE || errno == ENOBUFS || errno == ENOMEM;
        if (full_)
            log_(std::string("a connection has to wait: ") + std::strerror(errno));
        return;
    }
    const Endpoint host = endpointOf(peer);
    if (!admit(host))
        return;
    const auto onEnd = [counter = ended_.get()] { eventfd_write(counter, 1); };
    clients_.push_back(
        std::make_unique<Client>(std::move(socket), host.text(), options_.patience, log_, onEnd));
} catch (const std::exception& error) {  // there is no thread or no memory for another connection
    log_(std::string("a connection was refused: ") + error.what());
}

bool Server::admit(const Endpoint& peer) {
    const bool allowed = std::any_of(options_.allow.begin(), options_.allow.end(),
                                     [&](const Cidr& cidr) { return cidr.contains(peer.address); });
    if (!allowed) {
        log_(peer.text() + ": refused: not among those allowed");
        return false;
    }
    if (clients_.size() >= options_.maxClients) {
        log_(peer.text() + ": refused: " + std::to_string(clients_.size()) + " clients already");
        return false;
    }
    return true;
}

void Server::reap() {
    empty(ended_.get());
    std::erase_if(clients_, [](const auto& client) { return client->ended(); });
}

void Server::drain(int stop) {
    listener_ = Descriptor();
    for (const auto& client : clients_)
        client->drain();
    stopped_ = false;
    const auto deadline = std::chrono::steady_clock::now() + options_.patience.frame;
    while (!clients_.empty() && !stopped_ && std::chrono::steady_clock::now() < deadline) {
        const auto rest =
            std::chrono::ceil<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now());
        awaitChange(stop, static_cast<int>(rest.count()));
    }
    clients_.clear();
}

}  // namespace relay
