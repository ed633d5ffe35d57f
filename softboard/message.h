// A transport message as a value. Unlike a message buffer it can be copied, and nobody has to free it.
#ifndef SOFTBOARD_MESSAGE_H
#define SOFTBOARD_MESSAGE_H

#include <compare>
#include <cstdint>
#include <string>
#include <vector>

#include "softboard/abi.h"

namespace softboard {

// The address of a component instance, of a board's managers (0, board, 0, 0, 0) or of a host queue.
struct Address {
    uint16_t instance = 0;
    uint8_t board = 0;
    uint8_t processor = 0;
    uint8_t component = 0;
    uint8_t node = 0;

    auto operator<=>(const Address&) const = default;
};

Address addressOf(const NvCompDesc& nv);
NvCompDesc compDescOf(const Address& address);
// "node/board/processor/component/instance".
std::string toString(const Address& address);

using Octets = std::vector<uint8_t>;

struct Message {
    uint32_t transaction =
        0;  // the header's word: bits 8 to 31 are the number, bits 0 to 7 the library's own
    uint32_t type = 0;
    Address source;
    Address target;
    Octets body;
};

// Reads a message from a buffer, which holds nv.size octets of body; writes a message into a buffer, which
// must have room for the message's body.
Message messageOf(const NvMsg32Bit& nv);
void store(const Message& message, NvMsg32Bit& nv);

}  // namespace softboard

#endif
