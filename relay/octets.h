// Big-endian words of 32 bits among octets.
#ifndef RELAY_OCTETS_H
#define RELAY_OCTETS_H

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace relay {

using Octets = std::vector<std::uint8_t>;

inline void appendWord(Octets& to, std::uint32_t word) {
    for (int shift = 24; shift >= 0; shift -= 8)
        to.push_back(static_cast<std::uint8_t>(word >> shift));
}

// The word number `index`, which must be wholly inside the octets.
inline std::uint32_t wordAt(std::span<const std::uint8_t> octets, std::size_t index) {
    std::uint32_t word = 0;
    for (const std::uint8_t octet : octets.subspan(4 * index, 4))
        word = word << 8 | octet;
    return word;
}

}  // namespace relay

#endif
