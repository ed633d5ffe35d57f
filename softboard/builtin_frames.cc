#include "softboard/hex.h"
#include "softboard/scenario.h"

namespace softboard {

namespace {

struct Row {
    const char* octets;  // hexadecimal
    bool transmitted;
    uint32_t ticks;
};

// clang-format off
constexpr Row rows[] = {
#include "softboard/builtin_frames.inc"
};
// clang-format on

Frames load() {
    Frames frames;
    for (const Row& row : rows) {
        frames.push_back({row.transmitted, row.ticks, fromHex(row.octets)});
    }
    return frames;
}

}  // namespace

const Frames& builtinFrames() {
    static const Frames frames = load();
    return frames;
}

}  // namespace softboard
