#include "decoder/lines.h"

#include <gtest/gtest.h>

#include <climits>

#include "tests/decoder/capture.h"

namespace decoder::testing {
namespace {

std::string bits(int value, int high, int low) {
    Capture log;
    bitwise(value, high, low);
    return log.text();
}

TEST(Bitwise, ShowsTheFieldAtItsPlacesBehindSixBlanks) {
    const struct {
        const char* says;
        int value, high, low;
        const char* expected;
    } cases[] = {
        {"the extension bit", 0x80, 8, 8, "      1-------"},
        {"the low bits", 0x05, 3, 1, "      -----101"},
        {"one bit", 0x40, 7, 7, "      -1------"},
        {"a coding standard", 0xA1 & 0x60, 7, 6, "      -01-----"},
        {"a whole octet", 0xA5, 8, 1, "      10100101"},
        {"bits outside the field do not show", 0xFF, 5, 4, "      ---11---"},
        {"a value shifted down shows the wrong digits", 0x01, 7, 6, "      -00-----"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(bits(c.value, c.high, c.low), c.expected) << c.says;
}

// 8 - high dashes, the digits of positions in the octet, low - 1 dashes; a number below zero is none.
TEST(Bitwise, CountsItsDashesFromTheArgumentsAndShowsNoDigitOutsideTheOctet) {
    const struct {
        const char* says;
        int value, high, low;
        const char* expected;
    } cases[] = {
        {"above", 0xA5, 10, 1, "      10100101"},
        {"below", 0xA5, 8, 0, "      10100101"},
        {"both", 0xA5, 12, -3, "      10100101"},
        {"all above", 0xFF, 12, 9, "      --------"},
        {"all below", 0xFF, 0, -2, "      --------"},
        {"no position at all", 0xFF, 3, 5, "      ---------"},
        {"a field that ends below the octet", 0xFF, -2, -4, "      ----------"},
        {"a field that begins above the octet", 0xFF, 12, 11, "      ----------"},
        {"a field from above the octet", 0xA5, 10, 6, "      101-----"},
        {"crosswise beyond the octet", 0xFF, -1, 10, "      ------------------"},
        {"as far as numbers go", 0xA5, INT_MAX, INT_MIN, "      10100101"},
        {"bits above the eighth", 0x1FF, 8, 8, "      1-------"},
        {"a negative value", -1, 4, 3, "      ----11--"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(bits(c.value, c.high, c.low), c.expected) << c.says;
}

TEST(Lines, AreIndentedByExactly33BlanksWhenTheFlagIs0) {
    Capture log(0, 0);
    line("one");
    bitwise(0x80, 8, 8);
    text(" two\n");
    output(flag);
    text("three\n");
    EXPECT_EQ(log.text(), blanks + "one\n" + blanks + "      1------- two\n" + blanks + "three\n");
}

TEST(Lines, AreNotIndentedOtherwise) {
    for (const int indentation : {1, 2, -1}) {
        Capture log(0, indentation);
        line("one");
        bitwise(0x80, 8, 8);
        text(" two\n");
        output(flag);
        text("three\n");
        EXPECT_EQ(log.text(), "one\n      1------- two\nthree\n");
    }
}

TEST(Lines, TheIndentFollowsTheArgumentOfOutput) {
    Capture log(0, 1);
    output(0);
    text("|");
    output(1);
    EXPECT_EQ(log.text(), std::string(33, ' ') + "|");
}

TEST(Lines, ShowOctetsAndNumbersInTheirForms) {
    Capture log;
    text("0x", hex(0x05), " 0x", hex(0xAF), "|", hexUnpadded(0x05), " ", hexUnpadded(0xAF), " ",
         hexUnpadded(0), "|", hexBlankPadded(0x05), " ", hexBlankPadded(0xAF), "|", dec(0), " ", dec(-12),
         " ", dec(UINT_MAX), " ", dec(INT_MIN), "|", 'c', std::string_view("view"), "\n");
    EXPECT_EQ(log.text(), "0x05 0xaf|5 af 0| 5 af|0 -12 4294967295 -2147483648|cview\n");
}

TEST(Lines, ACharacterMayBeAnyOctet) {
    Capture log;
    std::string every;
    for (int i = 0; i < 256; ++i) {
        text(static_cast<char>(i));
        every += static_cast<char>(i);
    }
    EXPECT_EQ(log.text(), every);
}

TEST(Lines, StayInMemoryUntilTheyAreHandedOver) {
    Capture log;
    text("one");
    EXPECT_EQ(lineBuffer.composed(), "one");
    flushLines();
    EXPECT_EQ(lineBuffer.composed(), "");
    text("two");
    EXPECT_EQ(log.text(), "onetwo");
}

TEST(Lines, ASecondHandingOverWritesNothing) {
    Capture log;
    text("once");
    flushLines();
    flushLines();
    EXPECT_EQ(log.text(), "once");
}

TEST(Lines, AreKeptWholeHoweverManyThereAre) {
    Capture log;
    std::string expected;
    for (int i = 0; i < 20000; ++i) {
        line("line ", dec(i));
        expected += "line " + std::to_string(i) + "\n";
    }
    const std::string large(300000, 'x');
    text(std::string_view(large));
    EXPECT_EQ(log.text(), expected + large);
}

TEST(Lines, AreShownNowhereWithoutALog) {
    Capture log;
    std::FILE* const file = ofp;
    ::testing::internal::CaptureStdout();
    ::testing::internal::CaptureStderr();
    file_output = false;
    parse_isdn_frame(cursorOver({0x02, 0x01, 0x7F}));
    flushLines();
    file_output = true;
    ofp = nullptr;
    parse_isdn_frame(cursorOver({0x02, 0x01, 0x7F}));
    flushLines();
    ofp = file;
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "");
    EXPECT_EQ(::testing::internal::GetCapturedStderr(), "");
    EXPECT_EQ(log.text(), "");
}

TEST(Lines, NeverReachTheScreen) {
    ::testing::internal::CaptureStdout();
    ::testing::internal::CaptureStderr();
    const std::string text = decoded({0x02, 0x01, 0x7F}, 1, 1);
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "");
    EXPECT_EQ(::testing::internal::GetCapturedStderr(), "");
    EXPECT_FALSE(text.empty());
}

}  // namespace
}  // namespace decoder::testing
