// Messages of the transport library, and how frames carry them.
#ifndef RELAY_MESSAGE_H
#define RELAY_MESSAGE_H

#include <memory>

#include "norv/norv.h"
#include "relay/frame.h"

namespace relay {

struct FreeMessage {
    void operator()(NvMsg32Bit* msg) const { nvMsgFree(msg); }
};
using Message = std::unique_ptr<NvMsg32Bit, FreeMessage>;

// Null when the library has no memory.
Message newMessage(std::uint32_t bodySize);

inline constexpr std::size_t headerBlockSize = 56;
inline constexpr std::size_t openRequestSize = 28;

// The frame for msg, whose body is within the limit of a part.
Octets encodeMessage(const NvMsg32Bit& msg);
// The message of a frame. Throws Ended when its parts do not fit or a word does not fit its field.
Message decodeMessage(const Frame& frame);

// An address: node, board, processor, component, instance.
Octets encodeAddress(const NvCompDesc& address);

NvCompDesc sourceOf(const NvMsg32Bit& msg);
NvCompDesc targetOf(const NvMsg32Bit& msg);
void setSource(NvMsg32Bit& msg, const NvCompDesc& source);
void setTarget(NvMsg32Bit& msg, const NvCompDesc& target);
bool same(const NvCompDesc& a, const NvCompDesc& b);

}  // namespace relay

#endif
