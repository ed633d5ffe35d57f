// The blocks and options of pcapng, by their numbers, for reading and writing.
#ifndef CAPTURE_PCAPNG_BLOCKS_H
#define CAPTURE_PCAPNG_BLOCKS_H

#include <cstdint>
#include <string_view>

#include "capture/octets.h"

namespace capture::pcapng {

enum Block : std::uint32_t {
    sectionHeader = 0x0a0d0d0a,
    interfaceDescription = 1,
    packet = 2,  // the packet block of an older draft
    simplePacket = 3,
    interfaceStatistics = 5,
    enhancedPacket = 6
};

inline constexpr std::uint32_t orderMagic = 0x1a2b3c4d;
inline constexpr std::size_t blockOverhead = 12;  // type, length, and the length again

enum Option : std::uint16_t {
    endOfOptions = 0,
    comment = 1,
    userApplication = 4,  // of a section
    interfaceName = 2,
    interfaceText = 3,
    timeResolution = 9,
    checkSequenceSize = 13,
    timeOffset = 14,
    packetFlags = 2,
    dropCount = 4,
    interfaceDrops = 5
};

// The low bits of packetFlags.
inline constexpr std::uint32_t directionMask = 3;
inline constexpr std::uint32_t inbound = 1;
inline constexpr std::uint32_t outbound = 2;

constexpr std::size_t padded(std::size_t size) { return (size + 3) & ~std::size_t{3}; }

// A time's unit: 10^-power seconds, or 2^-power.
struct Resolution {
    bool isBinary = false;
    unsigned power = 6;  // at most 19 when decimal

    // Reads the value of an interface's option. A value that makes no sense gives microseconds.
    static Resolution of(char option);
    // Nanoseconds. A time that an int64_t cannot hold becomes the furthest time that it can.
    std::int64_t nanoseconds(std::uint64_t units) const;
};

// Gives the options at the end of a block, one after another, and ends at the first that does not fit.
class Options {
  public:
    Options(std::string_view octets, Order order) : rest_(octets), order_(order) {}

    bool next(std::uint16_t& code, std::string_view& value);

  private:
    std::string_view rest_;
    Order order_;
};

// Comments of an interface whose times do not count from 1970: they count from the first frame; or frames
// have none, and those of the packets are their ticks, or 0.
inline constexpr std::string_view relativeTimes = "lapdmon: times are relative";
inline constexpr std::string_view noTimes = "lapdmon: no times";

}  // namespace capture::pcapng

#endif
