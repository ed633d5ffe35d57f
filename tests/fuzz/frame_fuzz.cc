// A frame through the decoder, received and transmitted, on each trunk: its dump ends its text.
#include "tests/decoder/capture.h"
#include "tests/fuzz/dump.h"

namespace {

using namespace decoder::testing;

constexpr int trunks[] = {noTrunk, on4ess, on5ess, onDms100, onNtt, onNet5, onNi2};

std::string endOf(const fuzz::Octets& octets, bool transmitted) {
    if (octets.size() > decoder::maximumFrame)
        return (transmitted ? blanks : "") + "Oversized frame, frame will not be interpreted \n";
    return fuzz::dumpOf(octets, transmitted);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const fuzz::Octets octets(data, data + size);
    for (const bool transmitted : {false, true}) {
        const std::string end = endOf(octets, transmitted);
        for (const int trunk : trunks)
            fuzz::require(decoded(octets, trunk, transmitted ? 0 : 1).ends_with(end),
                          "the dump ends a frame's text");
    }
    return 0;
}
