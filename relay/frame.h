// Frames of the relay protocol: five big-endian words (type, transaction, sizes of the two parts, and one
// that is the sender's own), the data part, the extra part.
#ifndef RELAY_FRAME_H
#define RELAY_FRAME_H

#include <cstdint>
#include <span>

#include "relay/octets.h"

namespace relay {

namespace frame_type {
inline constexpr std::uint32_t message = 1001;  // data: header block; extra: body
inline constexpr std::uint32_t opened = 1002;   // data: the address of the queue that was opened
inline constexpr std::uint32_t open = 1003;     // data: address asked for, and two words more
inline constexpr std::uint32_t close = 2000;
inline constexpr std::uint32_t closed = 2001;
}  // namespace frame_type

inline constexpr std::size_t frameHeaderSize = 20;
inline constexpr std::uint32_t largestPart = 102400;  // octets

struct FrameHeader {
    std::uint32_t type = 0;
    std::uint32_t transaction = 0;  // an answer has that of its request
    std::uint32_t dataSize = 0;
    std::uint32_t extraSize = 0;

    // Throws Ended when a part is larger than allowed.
    static FrameHeader parse(std::span<const std::uint8_t, frameHeaderSize> octets);
};

struct Frame {
    FrameHeader header;
    Octets data;
    Octets extra;
};

Octets encodeFrame(std::uint32_t type, std::uint32_t transaction, std::span<const std::uint8_t> data = {},
                   std::span<const std::uint8_t> extra = {});

}  // namespace relay

#endif
