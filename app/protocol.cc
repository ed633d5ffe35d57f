#include "app/protocol.h"

#include <algorithm>
#include <array>

namespace app {

namespace {

// clang-format off
constexpr std::array Protocols{
    Protocol{ 1,  1, "4ESS Switch ",  "4ESS Switch \n"},
    Protocol{ 2,  2, "5ESS Switch ",  "5ESS Switch \n"},
    Protocol{ 3,  3, "DMS100 Switch", "DMS100 Switch \n"},
    Protocol{ 4,  4, "NTT Switch",    "NTT Switch \n"},
    Protocol{ 7,  7, "NET5 Switch",   "NET5 Switch \n"},
    Protocol{12, 10, "NI2 Switch",    "NI2 Switch \n"},
};
// clang-format on

}  // namespace

const Protocol* protocolOf(unsigned int type) {
    const auto* const found = std::find_if(Protocols.begin(), Protocols.end(),
                                           [type](const Protocol& p) { return p.type == type; });
    return found == Protocols.end() ? nullptr : found;
}

}  // namespace app
