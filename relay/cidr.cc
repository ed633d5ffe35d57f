#include "relay/cidr.h"

#include <arpa/inet.h>

#include <array>
#include <charconv>

namespace relay {

namespace {

constexpr unsigned addressBits = 32;

std::optional<std::uint32_t> parseAddress(const std::string& text) {
    in_addr address{};
    if (inet_pton(AF_INET, text.c_str(), &address) != 1)
        return std::nullopt;
    return ntohl(address.s_addr);
}

template <typename Number>
std::optional<Number> parseNumber(const std::string& text) {
    Number number{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size())
        return std::nullopt;
    return number;
}

}  // namespace

std::optional<Cidr> Cidr::parse(const std::string& text) {
    const std::size_t slash = text.find('/');
    const auto address = parseAddress(text.substr(0, slash));
    const auto bits =
        slash == std::string::npos ? addressBits : parseNumber<unsigned>(text.substr(slash + 1));
    if (!address || !bits || *bits > addressBits)
        return std::nullopt;
    const std::uint32_t mask = *bits == 0 ? 0 : ~std::uint32_t{0} << (addressBits - *bits);
    return Cidr{*address & mask, mask};
}

std::optional<Endpoint> Endpoint::parse(const std::string& text, std::uint16_t defaultPort) {
    const std::size_t colon = text.find(':');
    const auto address = parseAddress(text.substr(0, colon));
    const auto port =
        colon == std::string::npos ? defaultPort : parseNumber<std::uint16_t>(text.substr(colon + 1));
    if (!address || !port)
        return std::nullopt;
    return Endpoint{*address, *port};
}

std::string Endpoint::text() const {
    const in_addr network{htonl(address)};
    std::array<char, INET_ADDRSTRLEN> digits{};
    inet_ntop(AF_INET, &network, digits.data(), digits.size());
    return std::string(digits.data()) + ":" + std::to_string(port);
}

}  // namespace relay
