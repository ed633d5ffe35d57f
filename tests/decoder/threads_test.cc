// Threads decode at the same time, each a trunk of its own variant.
#include <gtest/gtest.h>

#include <barrier>
#include <string>
#include <thread>
#include <vector>

#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/lines.h"
#include "tests/decoder/capture.h"

namespace decoder {
namespace {

const std::vector<unsigned char> setup{0x02, 0x01, 0x00, 0x00, 0x08, 0x02, 0x00, 0x01,
                                       0x05, 0x04, 0x03, 0x80, 0x90, 0xa3, 0x18, 0x03,
                                       0xa9, 0x83, 0x9e, 0x70, 0x03, 0x80, 0x31, 0x32};

// The texts of so many rounds.
std::string composed(int variant, int indentation, int rounds) {
    swit = variant;
    flag = indentation;
    msglen = static_cast<int>(setup.size());
    std::string all;
    for (int i = 0; i < rounds; ++i) {
        RingBuffer rb;
        getBlock(&rb, setup, msglen);
        composeFrame(rb);
        all += lineBuffer.composed();
        lineBuffer.clear();
    }
    return all;
}

std::string times(const std::string& text, int rounds) {
    std::string all;
    for (int i = 0; i < rounds; ++i)
        all += text;
    return all;
}

TEST(DecodingThreads, DoNotMeet) {
    constexpr int rounds = 200;
    const std::string full = testing::decoded(setup, testing::onNet5, 1);
    const std::string brief = testing::decoded(setup, testing::onNi2, 0);
    ASSERT_NE(full, brief);

    std::barrier start(2);
    std::string first;
    std::string second;
    {
        const std::jthread one([&] {
            start.arrive_and_wait();
            first = composed(testing::onNet5, 1, rounds);
        });
        const std::jthread other([&] {
            start.arrive_and_wait();
            second = composed(testing::onNi2, 0, rounds);
        });
    }
    EXPECT_EQ(first, times(full, rounds));
    EXPECT_EQ(second, times(brief, rounds));
    EXPECT_EQ(swit, 0) << "the words of this thread";
}

TEST(ComposedFrame, StaysWithItsThreadUntilItIsFlushed) {
    testing::Capture log(testing::onNet5, 1);
    msglen = 3;
    RingBuffer rb;
    getBlock(&rb, std::vector<unsigned char>{0x00, 0x01, 0x7f}, 3);
    composeFrame(rb);
    const std::string text(lineBuffer.composed());
    EXPECT_TRUE(text.ends_with("Hex Dump: \n00 01 7f \n")) << text;
    EXPECT_EQ(log.text(), text);
    EXPECT_TRUE(lineBuffer.composed().empty());
}

}  // namespace
}  // namespace decoder
