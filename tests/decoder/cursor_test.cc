#include "decoder/cursor.h"

#include <gtest/gtest.h>

#include "tests/decoder/capture.h"

namespace decoder::testing {
namespace {

std::vector<unsigned char> counting(std::size_t size) {
    std::vector<unsigned char> octets(size);
    for (std::size_t i = 0; i < size; ++i)
        octets[i] = static_cast<unsigned char>(i + 1);
    return octets;
}

TEST(Cursor, HandsOutTheOctetsInOrderAndThenNothing) {
    RingBuffer rb = cursorOver({0x11, 0x22});
    EXPECT_EQ(rb.count, 2);
    unsigned char octet = 0;
    EXPECT_TRUE(getblockchar(&rb, &octet));
    EXPECT_EQ(octet, 0x11);
    EXPECT_EQ(rb.count, 1);
    EXPECT_TRUE(getblockchar(&rb, &octet));
    EXPECT_EQ(octet, 0x22);
    EXPECT_EQ(rb.count, 0);
    EXPECT_FALSE(getblockchar(&rb, &octet));
    EXPECT_EQ(octet, 0x22);
}

TEST(Cursor, WithoutOctetsLeavesTheCallersOctetUnchanged) {
    RingBuffer rb;
    unsigned char octet = 0x5A;
    EXPECT_FALSE(getblockchar(&rb, &octet));
    EXPECT_EQ(octet, 0x5A);
}

TEST(Cursor, HandsOutNothingWhenItsPointersMeetWhateverItsCount) {
    RingBuffer rb = cursorOver({0x11});
    rb.readPtr = rb.writePtr;
    unsigned char octet = 0x5A;
    EXPECT_FALSE(getblockchar(&rb, &octet));
    EXPECT_EQ(octet, 0x5A);
    EXPECT_EQ(rb.count, 1);
}

TEST(Cursor, ACopyReadsItsOwnOctets) {
    RingBuffer original = cursorOver({0x11, 0x22, 0x33});
    unsigned char octet = 0;
    getblockchar(&original, &octet);
    RingBuffer copy(original);
    original.data[1] = 0xEE;
    EXPECT_TRUE(getblockchar(&copy, &octet));
    EXPECT_EQ(octet, 0x22);
    EXPECT_EQ(original.count, 2);
    EXPECT_EQ(copy.stored(), 3);
}

TEST(Cursor, TakesAFrameOf257Octets) {
    Capture log;
    vela::staticList<unsigned char> list = listOf(counting(257));
    RingBuffer rb;
    EXPECT_TRUE(getBlock(&rb, list, 257));
    EXPECT_EQ(rb.count, 257);
    EXPECT_EQ(rb.data[0], 0x01);
    EXPECT_EQ(rb.data[256], 0x01);  // the 257th octet, counted modulo 256
    EXPECT_EQ(log.text(), "");
}

TEST(Cursor, RefusesAFrameOf258OctetsOnScreenAndInTheLog) {
    Capture log(0, 0);
    vela::staticList<unsigned char> list = listOf(counting(258));
    RingBuffer rb = cursorOver({0x11, 0x22});
    ::testing::internal::CaptureStdout();
    EXPECT_FALSE(getBlock(&rb, list, 258));
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "Oversized frame, frame will not be interpreted\n");
    EXPECT_EQ(log.text(),
              "                                 Oversized frame, frame will not be interpreted \n");
    EXPECT_EQ(rb.count, 0);
    EXPECT_EQ(rb.readPtr, rb.data);
    EXPECT_EQ(rb.writePtr, rb.data);
}

TEST(Cursor, ARefusalIsToldToTheProgramsOwnFunctionIfItHasOne) {
    static std::string told;
    Capture log;
    RingBuffer rb;
    ::testing::internal::CaptureStdout();
    writeScreen = [](std::string_view line) { told += line; };
    getBlock(&rb, counting(258), 258);
    writeScreen = writeToStandardOutput;
    EXPECT_EQ(told, "Oversized frame, frame will not be interpreted");
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "");
}

TEST(Cursor, ARefusalIsComposedBehindWhatWasComposedBeforeAndLeftToBeHandedOver) {
    Capture log;
    vela::staticList<unsigned char> list = listOf(counting(258));
    RingBuffer rb;
    text("RX Frame\n");
    ::testing::internal::CaptureStdout();
    getBlock(&rb, list, 258);
    ::testing::internal::GetCapturedStdout();
    const std::string whole = "RX Frame\nOversized frame, frame will not be interpreted \n";
    EXPECT_EQ(lineBuffer.composed(), whole);
    EXPECT_EQ(log.text(), whole);
}

TEST(Cursor, OversizeIsJudgedByTheLengthAndNotByTheList) {
    Capture log;
    vela::staticList<unsigned char> list = listOf(counting(2));
    RingBuffer rb;
    ::testing::internal::CaptureStdout();
    EXPECT_FALSE(getBlock(&rb, list, 258));
    ::testing::internal::GetCapturedStdout();
}

TEST(Cursor, TakesNoMoreThanTheListHolds) {
    vela::staticList<unsigned char> list = listOf({0x11, 0x22});
    RingBuffer rb;
    EXPECT_TRUE(getBlock(&rb, list, 200));
    EXPECT_EQ(rb.count, 2);
}

TEST(Cursor, TakesNoMoreThanTheLengthSays) {
    vela::staticList<unsigned char> list = listOf(counting(300));
    RingBuffer rb;
    EXPECT_TRUE(getBlock(&rb, list, 3));
    EXPECT_EQ(rb.count, 3);
}

TEST(Cursor, TakesANegativeLengthAsNone) {
    vela::staticList<unsigned char> list = listOf({0x11, 0x22});
    RingBuffer rb;
    EXPECT_TRUE(getBlock(&rb, list, -1));
    EXPECT_EQ(rb.count, 0);
}

}  // namespace
}  // namespace decoder::testing
