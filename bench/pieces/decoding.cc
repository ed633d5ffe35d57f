// Measures how octets become text. The text is composed and dropped; the octets a second that are shown are
// those of the text.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <vector>

#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/layer3.h"
#include "decoder/lines.h"
#include "decoder/state.h"
#include "softboard/scenario.h"

namespace {

using decoder::RingBuffer;
using Octets = std::vector<unsigned char>;

constexpr int onNet5 = 7;

// Calls `compose` again and again, each time with an empty buffer.
template <typename Compose>
void composing(benchmark::State& state, int flag, Compose compose) {
    decoder::file_output = false;
    decoder::swit = onNet5;
    decoder::flag = flag;
    std::size_t octets = 0;
    for (auto _ : state) {
        compose();
        octets += decoder::lineBuffer.composed().size();
        decoder::lineBuffer.clear();
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(octets));
}

RingBuffer cursorOver(const Octets& octets) {
    vela::staticList<unsigned char> list(static_cast<unsigned>(octets.size()));
    std::copy(octets.begin(), octets.end(), list.begin());
    RingBuffer cursor;
    decoder::getBlock(&cursor, list, static_cast<int>(octets.size()));
    return cursor;
}

// The benchmark's argument is the decoder's `flag`: 0 indents lines.
void bitwise(benchmark::State& state) {
    composing(state, static_cast<int>(state.range(0)), [] { decoder::bitwise(0x2A, 6, 2); });
}
BENCHMARK(bitwise)->Arg(1)->Arg(0);

void aLine(benchmark::State& state) {
    unsigned char octet = 0;
    composing(state, static_cast<int>(state.range(0)),
              [&] { decoder::line("  3:     0x", decoder::hex(++octet), "  Signal Value"); });
}
BENCHMARK(aLine)->Arg(1)->Arg(0);

void anElement(benchmark::State& state, const Octets& octets) {
    const RingBuffer whole = cursorOver(octets);
    composing(state, 1, [&] {
        RingBuffer cursor(whole);
        decoder::ie_id(&cursor);
    });
}
BENCHMARK_CAPTURE(anElement, bearerCapability, Octets{0x04, 0x03, 0x80, 0x90, 0xA3});
BENCHMARK_CAPTURE(anElement, channelIdentification, Octets{0x18, 0x03, 0xA9, 0x83, 0x81});
BENCHMARK_CAPTURE(anElement, cause, Octets{0x08, 0x02, 0x80, 0x90});
BENCHMARK_CAPTURE(anElement, calledPartyNumber,
                  Octets{0x70, 0x08, 0xA1, 0x35, 0x35, 0x35, 0x31, 0x32, 0x31, 0x32});

// The longest frame of the built-in capture, which is a SETUP. Below: a frame without a message.
const Octets& longestFrame() {
    const softboard::Frames& frames = softboard::builtinFrames();
    return std::max_element(frames.begin(), frames.end(),
                            [](const softboard::Frame& a, const softboard::Frame& b) {
                                return a.octets.size() < b.octets.size();
                            })
        ->octets;
}

void aFrame(benchmark::State& state, const Octets& octets, int flag) {
    const RingBuffer whole = cursorOver(octets);
    decoder::msglen = static_cast<int>(octets.size());
    decoder::file_output = false;
    decoder::swit = onNet5;
    decoder::flag = flag;
    for (auto _ : state) {
        decoder::parse_isdn_frame(whole);
        decoder::flushLines();
    }
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()));
}
BENCHMARK_CAPTURE(aFrame, receiveReady, Octets{0x02, 0x01, 0x01, 0x0A}, 1);
BENCHMARK_CAPTURE(aFrame, setup, longestFrame(), 1);
BENCHMARK_CAPTURE(aFrame, setupIndented, longestFrame(), 0);

}  // namespace
