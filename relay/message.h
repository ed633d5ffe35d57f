// Messages of the transport library, and the frames that carry them.
#ifndef RELAY_MESSAGE_H
#define RELAY_MESSAGE_H

#include <memory>

#include "norv/norv.h"
#include "relay/frame.h"

namespace relay {

struct FreeMessage {
    void operator()(NvMsg32Bit* msg) const { nvMsgFree(msg); }
};
// Owns a message buffer.
using Message = std::unique_ptr<NvMsg32Bit, FreeMessage>;

// Null when the library has no memory.
Message newMessage(std::uint32_t bodySize);

inline constexpr std::size_t headerBlockSize = 56;  // octets of a message frame's data part
inline constexpr std::size_t openRequestSize = 28;  // octets of an open frame's data part

// The octets of the frame that carries msg. The body of msg must not be larger than largestPart.
Octets encodeMessage(const NvMsg32Bit& msg);
// The message that a frame carries. Throws Ended when the sizes of the parts are wrong, when a word of the
// header block is too large for its field, or when the library has no memory.
Message decodeMessage(const Frame& frame);

// An address as five words: node, board, processor, component, instance.
Octets encodeAddress(const NvCompDesc& address);

NvCompDesc sourceOf(const NvMsg32Bit& msg);
NvCompDesc targetOf(const NvMsg32Bit& msg);
void setSource(NvMsg32Bit& msg, const NvCompDesc& source);
void setTarget(NvMsg32Bit& msg, const NvCompDesc& target);
bool same(const NvCompDesc& a, const NvCompDesc& b);

}  // namespace relay

#endif
