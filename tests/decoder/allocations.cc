// Decoding takes no memory for a frame. A program of its own, for its operator new counts.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <new>

#include "capture.h"
#include "golden_cases.h"

namespace {

unsigned long allocations = 0;

using golden::Octets;

// A link header, a message header, SETUP; then the element.
Octets frameWith(const Octets& element) {
    Octets frame{0x02, 0x01, 0x00, 0x00, 0x08, 0x01, 0x01, 0x05};
    frame.insert(frame.end(), element.begin(), element.end());
    frame.resize(std::min<std::size_t>(frame.size(), decoder::maximumFrame));
    return frame;
}

std::vector<vela::staticList<unsigned char>> goldenFrames() {
    std::vector<vela::staticList<unsigned char>> frames;
    for (const std::string& name : golden::names()) {
        for (const golden::Case& kase : golden::read(name).cases) {
            for (const Octets& octets : kase.octets)
                frames.push_back(
                    decoder::testing::listOf(kase.kind == golden::Kind::frame ? octets : frameWith(octets)));
        }
    }
    return frames;
}

// Frames that had something to show.
std::size_t decodeAll(std::vector<vela::staticList<unsigned char>>& frames) {
    std::size_t decoded = 0;
    for (const golden::Trunk& trunk : golden::trunks) {
        decoder::swit = trunk.variant;
        for (vela::staticList<unsigned char>& octets : frames) {
            decoder::RingBuffer frame;
            decoder::msglen = static_cast<int>(octets.length());
            if (decoder::getBlock(&frame, octets, decoder::msglen)) {
                decoder::parse_isdn_frame(frame);
                decoder::flushLines();
                ++decoded;
            }
        }
    }
    return decoded;
}

TEST(Decoding, OfAnyFrameAllocatesNothingOnceThereIsRoomForTheLongestText) {
    std::vector<vela::staticList<unsigned char>> frames = goldenFrames();
    std::FILE* const nowhere = std::fopen("/dev/null", "w");
    ASSERT_NE(nowhere, nullptr);
    decoder::ofp = nowhere;
    decoder::file_output = true;
    EXPECT_GT(decodeAll(frames), 1000U);
    const unsigned long before = allocations;
    EXPECT_GT(before, 0U);
    decodeAll(frames);
    EXPECT_EQ(allocations - before, 0U);
    decoder::ofp = nullptr;
    decoder::file_output = false;
    static_cast<void>(std::fclose(nowhere));
}

}  // namespace

// Not inlined, where the compiler would see new and free side by side.
[[gnu::noinline]] void* operator new(std::size_t size) {
    ++allocations;
    void* const memory = std::malloc(size);  // NOLINT(*-no-malloc): this is what new stands on
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}
[[gnu::noinline]] void operator delete(void* memory) noexcept { std::free(memory); }  // NOLINT(*-no-malloc)
[[gnu::noinline]] void operator delete(void* memory, std::size_t) noexcept { operator delete(memory); }
