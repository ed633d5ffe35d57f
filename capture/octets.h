// Reads numbers from the octets of capture files, in either order of octets.
#ifndef CAPTURE_OCTETS_H
#define CAPTURE_OCTETS_H

#include <bit>
#include <concepts>
#include <cstdint>
#include <cstring>
#include <span>
#include <string_view>

namespace capture {

enum class Order : std::uint8_t { little, big };

// The number that begins at `at`. The caller must have checked that all its octets are there.
template <std::unsigned_integral Number>
Number numberAt(std::string_view octets, std::size_t at, Order order) {
    Number number = 0;
    for (std::size_t i = 0; i < sizeof(Number); ++i) {
        const std::size_t from = at + (order == Order::big ? i : sizeof(Number) - 1 - i);
        number = static_cast<Number>(static_cast<std::uint64_t>(number) << 8U |
                                     static_cast<unsigned char>(octets[from]));
    }
    return number;
}

inline std::span<const std::uint8_t> octetsOf(std::string_view text) {
    return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
}
inline std::string_view textOf(std::span<const std::uint8_t> octets) {
    return {reinterpret_cast<const char*>(octets.data()), octets.size()};
}

}  // namespace capture

#endif
