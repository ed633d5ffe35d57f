// The protocol types that a trunk can report, and the switch variant by which each is decoded.
#ifndef APP_PROTOCOL_H
#define APP_PROTOCOL_H

#include <optional>
#include <string_view>

namespace app {

struct Protocol {
    unsigned int type;  // CCS parameter 7
    int variant;        // decoder::swit
    std::string_view screenLine;
    std::string_view logLine;
};

// Returns null for a type that cannot be decoded.
const Protocol* protocolOf(unsigned int type);

// Says on the screen and in the log what the trunk reports. Returns the variant by which its frames are
// decoded; nothing, and a line on the standard error stream, for a type that cannot be decoded.
std::optional<int> reportProtocol(unsigned int type);

}  // namespace app

#endif
