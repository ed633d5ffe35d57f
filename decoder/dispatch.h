// The look-ups by code: frame names, message types, element identifiers.
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

// By the first control octet; of kind `none` when it names no supervisory or unnumbered frame.
const FrameName& frameName(unsigned char control);

// Empty when the type is not known. Maintenance messages have a table of their own.
std::string_view messageName(unsigned char type);
std::string_view maintenanceMessageName(unsigned char type);

// Null when the identifier is not known.
ElementDecoder elementDecoder(unsigned char id);

}  // namespace decoder

#endif
