// The other end of a TCP connection, for tests that send and receive single octets. Nothing waits longer than
// half a minute.
#ifndef TESTS_SUPPORT_TCP_H
#define TESTS_SUPPORT_TCP_H

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cstdint>
#include <initializer_list>
#include <string>
#include <utility>
#include <vector>

namespace tcp {

using Octets = std::vector<std::uint8_t>;

// The octets of 32-bit words, big-endian.
inline Octets words(std::initializer_list<std::uint32_t> values) {
    Octets octets;
    for (const std::uint32_t value : values) {
        for (int shift = 24; shift >= 0; shift -= 8)
            octets.push_back(static_cast<std::uint8_t>(value >> shift));
    }
    return octets;
}

inline Octets operator+(Octets a, const Octets& b) {
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

inline sockaddr_in loopbackAddress(std::uint16_t port) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    address.sin_port = htons(port);
    return address;
}

class Connection {
  public:
    explicit Connection(int fd) : fd_(fd) {
        const timeval limit{30, 0};
        setsockopt(fd_, SOL_SOCKET, SO_RCVTIMEO, &limit, sizeof limit);
        setsockopt(fd_, SOL_SOCKET, SO_SNDTIMEO, &limit, sizeof limit);
    }
    Connection(Connection&& other) noexcept : fd_(std::exchange(other.fd_, -1)) {}
    Connection& operator=(Connection&&) = delete;
    ~Connection() { close(); }

    static Connection to(std::uint16_t port) {
        Connection connection(::socket(AF_INET, SOCK_STREAM, 0));
        const sockaddr_in address = loopbackAddress(port);
        if (::connect(connection.fd_, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0)
            connection.close();
        return connection;
    }

    // Reads so many octets, or fewer if the other end closes before.
    Octets read(std::size_t size) const {
        Octets octets(size);
        std::size_t got = 0;
        while (got < size) {
            const ssize_t count = recv(fd_, octets.data() + got, size - got, 0);
            if (count <= 0)
                break;
            got += static_cast<std::size_t>(count);
        }
        octets.resize(got);
        return octets;
    }

    // Reads until the other end closes. Returns false when it does not.
    bool ends() const {
        Octets dropped(65536);
        ssize_t count = 0;
        while ((count = recv(fd_, dropped.data(), dropped.size(), 0)) > 0) {
        }
        return count == 0 || (errno != EAGAIN && errno != EWOULDBLOCK);
    }

    bool write(const Octets& octets) const {
        return send(fd_, octets.data(), octets.size(), MSG_NOSIGNAL) == static_cast<ssize_t>(octets.size());
    }

    void close() {
        if (fd_ >= 0)
            ::close(std::exchange(fd_, -1));
    }

    int get() const { return fd_; }
    int release() { return std::exchange(fd_, -1); }

  private:
    int fd_;
};

class Listener {
  public:
    Listener() : fd_(::socket(AF_INET, SOCK_STREAM, 0)) {
        sockaddr_in address = loopbackAddress(0);
        socklen_t size = sizeof address;
        static_cast<void>(::bind(fd_, reinterpret_cast<const sockaddr*>(&address), size));
        static_cast<void>(::listen(fd_, 16));
        getsockname(fd_, reinterpret_cast<sockaddr*>(&address), &size);
        port_ = ntohs(address.sin_port);
    }
    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;
    ~Listener() { ::close(fd_); }

    std::uint16_t port() const { return port_; }
    std::string host(const std::string& name = "127.0.0.1") const {
        return name + ":" + std::to_string(port_);
    }
    Connection accept() const { return Connection(::accept(fd_, nullptr, nullptr)); }

  private:
    int fd_;
    std::uint16_t port_ = 0;
};

}  // namespace tcp

#endif
