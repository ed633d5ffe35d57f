#include "app/protocol.h"

#include <algorithm>
#include <array>
#include <iostream>

#include "decoder/lines.h"

#include "decoder/log_lines.h"

namespace app {

namespace {

// clang-format off
constexpr std::array protocols{
    Protocol{ 1,  1, "4ESS Switch ",  decoder::variantLine(1)},
    Protocol{ 2,  2, "5ESS Switch ",  decoder::variantLine(2)},
    Protocol{ 3,  3, "DMS100 Switch", decoder::variantLine(3)},
    Protocol{ 4,  4, "NTT Switch",    decoder::variantLine(4)},
    Protocol{ 7,  7, "NET5 Switch",   decoder::variantLine(7)},
    Protocol{12, 10, "NI2 Switch",    decoder::variantLine(10)},
};
// clang-format on

}  // namespace

const Protocol* protocolOf(unsigned int type) {
    const auto* const found = std::find_if(protocols.begin(), protocols.end(),
                                           [type](const Protocol& p) { return p.type == type; });
    return found == protocols.end() ? nullptr : found;
}

std::optional<int> reportProtocol(unsigned int type) {
    std::cout << "CCS protocol type is " << type << std::endl;
    const Protocol* const protocol = protocolOf(type);
    if (protocol == nullptr) {
        std::cerr << "Unknow Protocol -- I don't know how to interprete. "
                  << "Program is terminating!" << std::endl;
        return std::nullopt;
    }
    std::cout << protocol->screenLine << std::endl;
    decoder::text(protocol->logLine);
    decoder::flushLines();
    return protocol->variant;
}

}  // namespace app
