#include "softboard/hex.h"

#include <stdexcept>

namespace softboard {

namespace {

constexpr std::string_view digits = "0123456789abcdef";

size_t digit(char c) {
    const size_t value = digits.find(c);
    if (value == std::string_view::npos) {
        throw std::invalid_argument(std::string("not a hexadecimal digit: ") + c);
    }
    return value;
}

}  // namespace

std::string hex(std::span<const uint8_t> octets) {
    std::string text;
    text.reserve(octets.size() * 2);
    for (const uint8_t octet : octets) {
        text += {digits[octet >> 4], digits[octet & 15]};
    }
    return text;
}

std::vector<uint8_t> fromHex(std::string_view text) {
    if (text.size() % 2 != 0) {
        throw std::invalid_argument("an odd number of hexadecimal digits");
    }
    std::vector<uint8_t> octets;
    octets.reserve(text.size() / 2);
    for (size_t at = 0; at < text.size(); at += 2) {
        octets.push_back(static_cast<uint8_t>(digit(text[at]) << 4 | digit(text[at + 1])));
    }
    return octets;
}

}  // namespace softboard
