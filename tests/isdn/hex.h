// Octets written as hex digits in tests; blanks between them mean nothing.
#ifndef TESTS_ISDN_HEX_H
#define TESTS_ISDN_HEX_H

#include <cstdint>
#include <string_view>
#include <vector>

#include "isdn/octets.h"

namespace isdn::testing {

inline std::vector<std::uint8_t> hex(std::string_view text) {
    std::vector<std::uint8_t> octets;
    unsigned value = 0;
    bool half = false;
    for (const char c : text) {
        if (c == ' ' || c == '\n')
            continue;
        const unsigned digit =
            c <= '9' ? static_cast<unsigned>(c - '0') : (static_cast<unsigned>(c) | 0x20U) - 'a' + 10U;
        value = value << 4 | digit;
        if (half)
            octets.push_back(static_cast<std::uint8_t>(value));
        half = !half;
        value &= 0xFU;
    }
    return octets;
}

}  // namespace isdn::testing

#endif
