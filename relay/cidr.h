// IPv4 addresses: who may connect, and where to listen.
#ifndef RELAY_CIDR_H
#define RELAY_CIDR_H

#include <cstdint>
#include <optional>
#include <string>

namespace relay {

// A network, "192.168.1.0/24", or one machine, "192.168.1.7". All addresses are in host byte order.
struct Cidr {
    std::uint32_t network = 0;
    std::uint32_t mask = 0;

    // Nothing when the text is neither.
    static std::optional<Cidr> parse(const std::string& text);
    bool contains(std::uint32_t address) const { return (address & mask) == network; }
};

inline constexpr Cidr loopback{0x7F000000, 0xFF000000};

struct Endpoint {
    std::uint32_t address = 0;
    std::uint16_t port = 0;

    // Reads "ADDR:PORT", or "ADDR" with the default port. Nothing for any other text. To listen on port 0
    // lets the system choose a port.
    static std::optional<Endpoint> parse(const std::string& text, std::uint16_t defaultPort);
    std::string text() const;  // "ADDR:PORT"
};

}  // namespace relay

#endif
