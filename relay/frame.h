// Frames of the relay protocol. A frame is five big-endian words of 32 bits (type, transaction, size of the
// data part, size of the extra part, and one for the sender's own use), then the data part, then the extra
// part.
#ifndef RELAY_FRAME_H
#define RELAY_FRAME_H

#include <cstdint>
#include <span>

#include "relay/octets.h"

namespace relay {

namespace frame_type {
inline constexpr std::uint32_t message = 1001;  // data: header block; extra: body
inline constexpr std::uint32_t opened = 1002;   // data: the address of the queue that was opened
inline constexpr std::uint32_t open = 1003;    // data: the address that the host asks for, and two more words
inline constexpr std::uint32_t close = 2000;   // from a host: close my queue; from the relay: it ends
inline constexpr std::uint32_t closed = 2001;  // the queue has been closed as asked
}  // namespace frame_type

inline constexpr std::size_t frameHeaderSize = 20;
inline constexpr std::uint32_t largestPart = 102400;  // octets

struct FrameHeader {
    std::uint32_t type = 0;
    std::uint32_t transaction = 0;  // an answer has the transaction of its request
    std::uint32_t dataSize = 0;
    std::uint32_t extraSize = 0;

    // Throws Ended when a part is larger than largestPart.
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
