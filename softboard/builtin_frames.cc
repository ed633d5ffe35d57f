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

constexpr uint8_t digit(char c) { return static_cast<uint8_t>(c <= '9' ? c - '0' : c - 'a' + 10); }

Frames load() {
    Frames frames;
    for (const Row& row : rows) {
        Frame& frame = frames.emplace_back(Frame{row.transmitted, row.ticks, {}});
        for (const char* at = row.octets; *at != '\0'; at += 2) {
            frame.octets.push_back(static_cast<uint8_t>(digit(at[0]) << 4 | digit(at[1])));
        }
    }
    return frames;
}

}  // namespace

const Frames& builtinFrames() {
    static const Frames frames = load();
    return frames;
}

}  // namespace softboard
