// A transport message as the board sees it: a value, no buffer.
#ifndef SOFTBOARD_MESSAGE_H
#define SOFTBOARD_MESSAGE_H

#include <compare>
#include <cstdint>
#include <string>
#include <vector>

#include "softboard/abi.h"

namespace softboard {

// Where a component instance, a manager (0, board, 0, 0, 0) or a host queue is.
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
    uint32_t transaction = 0;  // the header's word: bits 8 to 31 the id, bits 0 to 7 carried along
    uint32_t type = 0;
    Address source;
    Address target;
    Octets body;
};

// To and from a buffer, which must hold nv.size octets of body.
Message messageOf(const NvMsg32Bit& nv);
void store(const Message& message, NvMsg32Bit& nv);

}  // namespace softboard

#endif
