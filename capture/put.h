// Writes numbers into the octets of capture files, least significant octet first.
#ifndef CAPTURE_PUT_H
#define CAPTURE_PUT_H

#include <bit>
#include <concepts>
#include <cstdint>
#include <cstring>
#include <string>

namespace capture {

static_assert(std::endian::native == std::endian::little, "numbers are copied as they are");

template <std::unsigned_integral Number>
void put(std::string& octets, Number number) {
    char copy[sizeof number];
    std::memcpy(copy, &number, sizeof number);
    octets.append(copy, sizeof number);
}

// Writes the number over the octets at `at`.
template <std::unsigned_integral Number>
void replace(std::string& octets, std::size_t at, Number number) {
    std::memcpy(octets.data() + at, &number, sizeof number);
}

}  // namespace capture

#endif
