// Octets as hexadecimal digits.
#ifndef CAPTURE_HEX_DIGITS_H
#define CAPTURE_HEX_DIGITS_H

#include <array>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace capture {

namespace tables {

constexpr std::array<std::int8_t, 256> makeHexValues() {
    std::array<std::int8_t, 256> values{};
    values.fill(-1);
    for (std::size_t i = 0; i < 10; ++i)
        values['0' + i] = static_cast<std::int8_t>(i);
    for (std::size_t i = 0; i < 6; ++i)
        values['a' + i] = values['A' + i] = static_cast<std::int8_t>(10 + i);
    return values;
}

inline constexpr auto hexValues = makeHexValues();

}  // namespace tables

// The value of a hexadecimal digit, or a negative number for any other character.
inline int hexValue(char c) { return tables::hexValues[static_cast<unsigned char>(c)]; }

// Appends the octets that the digits stand for. Returns false if their number is odd or one of them is no
// digit; then the octets before that place may have been appended.
inline bool appendOctets(std::string_view digits, std::vector<std::uint8_t>& octets) {
    if (digits.size() % 2 != 0)
        return false;
    for (std::size_t at = 0; at < digits.size(); at += 2) {
        const int high = hexValue(digits[at]);
        const int low = hexValue(digits[at + 1]);
        if (high < 0 || low < 0)
            return false;
        octets.push_back(static_cast<std::uint8_t>(high << 4 | low));
    }
    return true;
}

// Appends two lower-case digits an octet.
inline void appendDigits(std::span<const std::uint8_t> octets, std::string& text) {
    constexpr std::string_view digits = "0123456789abcdef";
    for (const std::uint8_t octet : octets)
        text += {digits[octet >> 4U], digits[octet & 15U]};
}

}  // namespace capture

#endif
