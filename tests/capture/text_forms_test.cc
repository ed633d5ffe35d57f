#include "capture/text_forms.h"

#include <gtest/gtest.h>

#include "tests/capture/reading.h"

namespace capture {
namespace {

using testing::Folder;
using testing::itemsIn;

class TextForms : public ::testing::Test {
  protected:
    TextForms() {
        setenv("TZ", "CET-1", 1);
        tzset();
    }
    ~TextForms() override {
        setenv("TZ", "UTC", 1);
        tzset();
    }

    std::string read(std::string_view text) const { return itemsIn(folder_.write("input.txt", text)); }

    Folder folder_;
};

TEST_F(TextForms, AHexLineIsADirectionAndOctets) {
    EXPECT_EQ(read("TX 00017f\nRX 00 01 73\n1 020101A5\n0 02 01 01 a5\ntx 00 01\nrx 0001\n"),
              "frame 1 TX 00017f\n"
              "frame 2 RX 000173\n"
              "frame 3 TX 020101a5\n"
              "frame 4 RX 020101a5\n"
              "frame 5 TX 0001\n"
              "frame 6 RX 0001\n");
}

TEST_F(TextForms, AHexLineMayHaveATime) {
    EXPECT_EQ(read("RX 2026-11-21T11:25:33.3Z 0001\n"
                   "RX 2026-11-21T11:25:33.004+02:00 00 01\n"
                   "RX 2026-11-21T11:25:33 0001\n"
                   "TX 12.345 0001\n"
                   "TX 00:00:01.5 0001\n"
                   "1 1095 00019009\n"
                   "1 10 95\n"),
              "frame 1 RX 1795260333300ms 0001\n"
              "frame 2 RX 1795253133004ms 0001\n"
              "frame 3 RX 1795256733000ms 0001\n"
              "frame 4 TX +12345ms 0001\n"
              "frame 5 TX +1500ms 0001\n"
              "frame 6 TX t1095 00019009\n"
              "frame 7 TX 1095\n");
}

TEST_F(TextForms, BlankLinesAndCommentsStandBetweenHexLines) {
    EXPECT_EQ(read("# recorded yesterday\n\n  \nTX 0001  # the first\r\n# end"), "frame 4 TX 0001\n");
}

TEST_F(TextForms, ALineThatIsNoHexLineIsReported) {
    const std::string none = " x1 \"this line is no direction, time and octets; it is passed over\"\n";
    EXPECT_EQ(read("TX 0001\nsomething\nTX 000\nTX 00 0g\nTX\nRX 0001\n"),
              "frame 1 TX 0001\nunproved 2" + none + "unproved 3" + none + "unproved 4" + none +
                  "unproved 5" + none + "frame 6 RX 0001\n");
}

TEST_F(TextForms, TheLastHexLineMayLackItsEnd) {
    EXPECT_EQ(read("TX 0001\nRX 0102"), "frame 1 TX 0001\nframe 2 RX 0102\n");
}

TEST_F(TextForms, DumpsStandInBracketsBehindTheirDirection) {
    EXPECT_EQ(read("-- span 1 up\n"
                   "> [ 00 01 7f ]\n"
                   "> Unnumbered frame: a [ note ] of something\n"
                   "\n"
                   "< [ 00 01 73 ]\n"
                   "span 1 < [02 01 01 a5]\n"
                   "> [ ]\n"
                   "> [ 0g ]\n"),
              "frame 2 TX 00017f\n"
              "frame 5 RX 000173\n"
              "frame 6 RX 020101a5\n"
              "frame 7 TX \n");
}

TEST_F(TextForms, ADumpMayGoOnInTheNextLines) {
    EXPECT_EQ(read("< [ 02 01 00 00\n    08 02 03 78 05\n    a1 ]\n> [ 00 01 7f ]\n"),
              "frame 1 RX 02010000080203780"
              "5a1\nframe 4 TX 00017f\n");
}

TEST_F(TextForms, ADumpWithoutItsBracketIsCut) {
    EXPECT_EQ(read("< [ 02 01\nTX something else\n> [ 00 01 7f ]\n> [ 00 01"),
              "cut 1 RX 0201 \"the dump has no closing bracket\"\n"
              "frame 3 TX 00017f\n"
              "cut 4 TX 0001 \"the dump has no closing bracket\"\n");
}

TEST_F(TextForms, ADumpHasTheTimeAtTheBeginningOfItsLine) {
    EXPECT_EQ(read("[2026-11-21 11:25:33.250] VERBOSE > [ 00 01 7f ]\n"
                   "2026-11-21 11:25:34 < [ 00 01 73 ]\n"),
              "frame 1 TX 1795256733250ms 00017f\nframe 2 RX 1795256734000ms 000173\n");
    EXPECT_EQ(read("[Nov 21 23:59:59] > [ 00 01 7f ]\n[Nov 22 00:00:01] < [ 00 01 73 ]\n"),
              "frame 1 TX +0ms 00017f\nframe 2 RX +2000ms 000173\n");
}

TEST_F(TextForms, AnInputWithoutAFrameHasNoKnownForm) {
    EXPECT_EQ(read("once upon a time\n"), "!: unknown file format\n");
    EXPECT_EQ(read(""), "!: it is empty\n");
    EXPECT_EQ(read("# nothing\n"), "!: unknown file format\n");
}

TEST_F(TextForms, AByteOrderMarkIsNoPartOfTheText) {
    EXPECT_EQ(read("\xef\xbb\xbfTX 00017f\n"), "frame 1 TX 00017f\n");
    EXPECT_EQ(read("\xef\xbb\xbf> [ 00 01 7f ]\n"), "frame 1 TX 00017f\n");
    EXPECT_EQ(read("\xef\xbb\xbf"), "!: it is empty\n");
    EXPECT_EQ(read("\xef\xbb"), "!: unknown file format\n");
}

TEST_F(TextForms, WhatMustBeUnpackedFirstIsSaid) {
    EXPECT_EQ(read("\x1f\x8b\x08 and so on"),
              "!: unknown file format; it is compressed with gzip: unpack it first\n");
    EXPECT_EQ(read("\xff\xfeT\0X\0"),
              "!: unknown file format; it is text in UTF-16: convert it to UTF-8 first\n");
}

TEST_F(TextForms, EveryBeginningOfAnInputIsReadToItsEnd) {
    for (const std::string whole :
         {"# day\nTX 0001 # one\n0 1095 00019009\nRX 2026-11-21T11:25:33.3Z 00 01\n",
          "[2026-11-21 11:25:33.250] x > [ 00 01 7f ]\n< [ 00 01\n 02 ]\n"}) {
        for (std::size_t size = 0; size < whole.size(); ++size) {
            const std::string items = read(whole.substr(0, size));
            EXPECT_FALSE(items.empty()) << whole.substr(0, size);
        }
    }
}

}  // namespace
}  // namespace capture
