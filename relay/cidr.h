// IPv4 addresses: who may connect, and where to listen.
#ifndef RELAY_CIDR_H
#define RELAY_CIDR_H

#include <cstdint>
#include <optional>
#include <string>

namespace relay {

// A network: "192.168.1.0/24", or one machine, "192.168.1.7". Addresses in host order.
struct Cidr {
    std::uint32_t network = 0;
    std::uint32_t mask = 0;

    static std::optional<Cidr> parse(const std::string& text);
    bool contains(std::uint32_t address) const { return (address & mask) == network; }
};

inline constexpr Cidr loopback{0x7F000000, 0xFF000000};

struct Endpoint {
    std::uint32_t address = 0;
    std::uint16_t port = 0;

    // "ADDR:PORT" or "ADDR"; port 0 has the system choose one.
    static std::optional<Endpoint> parse(const std::string& text, std::uint16_t defaultPort);
    std::string text() const;
};

}  // namespace relay

#endif
