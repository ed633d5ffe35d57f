#include "capture/pcapng_blocks.h"

#include <algorithm>
#include <limits>

namespace capture::pcapng {

namespace {

constexpr std::int64_t perSecond = 1'000'000'000;

std::int64_t inNanoseconds(std::uint64_t seconds, std::uint64_t fraction) {
    constexpr auto most =
        static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max() / perSecond - 1);
    return static_cast<std::int64_t>(std::min(seconds, most)) * perSecond +
           static_cast<std::int64_t>(fraction);
}

}  // namespace

Resolution Resolution::of(char option) {
    constexpr unsigned binary = 0x80;
    constexpr unsigned mostDecimal = 19;  // 10^19 is the last that 64 bits hold
    const auto octet = static_cast<unsigned char>(option);
    const Resolution told{(octet & binary) != 0, octet & ~binary};
    return told.isBinary || told.power <= mostDecimal ? told : Resolution{};
}

std::int64_t Resolution::nanoseconds(std::uint64_t units) const {
    if (isBinary) {
        if (power >= 64)
            return 0;
        const std::uint64_t fraction = units & ((std::uint64_t{1} << power) - 1);
        constexpr unsigned kept = 30;  // bits of the fraction, so that its product with 10^9 fits
        const unsigned dropped = power > kept ? power - kept : 0;
        return inNanoseconds(units >> power, (fraction >> dropped) * perSecond >> (power - dropped));
    }
    std::uint64_t unitsPerSecond = 1;
    for (unsigned i = 0; i < power; ++i)
        unitsPerSecond *= 10;
    const std::uint64_t fraction = units % unitsPerSecond;
    const std::uint64_t scaled = unitsPerSecond <= perSecond ? fraction * (perSecond / unitsPerSecond)
                                                             : fraction / (unitsPerSecond / perSecond);
    return inNanoseconds(units / unitsPerSecond, scaled);
}

bool Options::next(std::uint16_t& code, std::string_view& value) {
    constexpr std::size_t headerSize = 4;
    if (rest_.size() < headerSize)
        return false;
    code = numberAt<std::uint16_t>(rest_, 0, order_);
    const std::size_t size = numberAt<std::uint16_t>(rest_, 2, order_);
    if (code == endOfOptions || rest_.size() - headerSize < size)
        return false;
    value = rest_.substr(headerSize, size);
    rest_.remove_prefix(std::min(rest_.size(), headerSize + padded(size)));
    return true;
}

}  // namespace capture::pcapng
