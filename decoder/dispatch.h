// The tables of codes: names of frames and messages, and the decoder of each element.
#ifndef DECODER_DISPATCH_H
#define DECODER_DISPATCH_H

#include <string_view>

#include "decoder/cursor.h"

namespace decoder {

enum class FrameKind : unsigned char { none, supervisory, unnumbered, unnumberedInformation };

struct FrameName {
    unsigned char code;
    FrameKind kind;
    std::string_view name;
};

using ElementDecoder = void (*)(unsigned char id, RingBuffer* rb);

// Looks a frame up by its first control octet. The kind is `none` when the octet is no supervisory or
// unnumbered frame of the table.
const FrameName& frameName(unsigned char control);

// The name of a message type, empty when it is not known. Messages of the maintenance protocols have a table
// of their own.
std::string_view messageName(unsigned char type);
std::string_view maintenanceMessageName(unsigned char type);

// The decoder of an element, by its identifier. Null when the identifier is not known.
ElementDecoder elementDecoder(unsigned char id);

}  // namespace decoder

#endif
