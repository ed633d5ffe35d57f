// The protocol types a trunk can report, and the switch variant that each is decoded as.
#ifndef APP_PROTOCOL_H
#define APP_PROTOCOL_H

#include <string_view>

namespace app {

struct Protocol {
    unsigned int type;  // CCS parameter 7
    int variant;        // decoder::swit
    std::string_view screenLine;
    std::string_view logLine;
};

// Null for a type that nobody knows how to decode.
const Protocol* protocolOf(unsigned int type);

}  // namespace app

#endif
