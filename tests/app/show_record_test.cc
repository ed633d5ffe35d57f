#include <gtest/gtest.h>

#include <cstdlib>
#include <ctime>
#include <string>
#include <string_view>
#include <vector>

#include "app/display.h"
#include "decoder/lines.h"
#include "decoder/state.h"
#include "tests/app/channels.h"
#include "tests/app/records.h"

namespace app {
namespace {

using testing::blanks;
using testing::dated;
using testing::fill;
using testing::Octets;
using testing::received;
using testing::Record;
using testing::transmitted;

class ShowRecord : public ::testing::Test {
  protected:
    ShowRecord() {
        setenv("TZ", "UTC", 1);
        tzset();
    }

    void show(Record& rec) { showRecord(rec, octets_); }
    void show(unsigned int direction, unsigned int timestamp, const Octets& octets) {
        Record rec;
        fill(rec, direction, timestamp, octets);
        show(rec);
    }
    std::string log() const { return dated(log_.text()); }
    std::string screen() const { return screen_.text(); }

    vela::staticList<unsigned char> octets_;
    testing::Screen screen_;
    testing::Log log_;
};

TEST_F(ShowRecord, IndentsATransmittedFrameAndStartsItWithAnEmptyLine) {
    show(transmitted, 3001, {0x00, 0x01, 0x7F});
    EXPECT_EQ(log(), "\n" + blanks + "DATE\n" + blanks + "TX Frame: Time = 12.4\n" + blanks +
                         "Response=0    SAPI=0x00\n" + blanks + "TEI=0x00\n" + blanks +
                         "    0x7f  Set Asynchronous Balanced Mode\n" + blanks + "Hex Dump: \n" + blanks +
                         "00 01 7f \n");
    EXPECT_EQ(screen(), "");
}

TEST_F(ShowRecord, WritesAReceivedFrameFlushLeft) {
    show(received, 250, {0x02, 0x01, 0x01, 0x05});
    EXPECT_EQ(log(),
              "\n"
              "DATE\n"
              "RX Frame: Time = 1.0\n"
              "Command=1   SAPI=0x00\n"
              "TEI=0x00\n"
              "0x01 0x05  Receive Ready\n"
              "Hex Dump: \n"
              "02 01 01 05 \n");
    EXPECT_EQ(screen(), "");
}

TEST_F(ShowRecord, HandsTheTextOfARecordToTheLogInOnePieceEvenWhenItRefusesTheFrame) {
    static std::vector<std::string> pieces;
    pieces.clear();
    decoder::writeLog = [](std::string_view piece) { pieces.push_back(dated(std::string(piece))); };
    show(received, 250, {0x02, 0x01, 0x01, 0x05});
    show(received, 250, Octets(300, 0x00));
    decoder::writeLog = decoder::writeToStream;
    EXPECT_EQ(pieces,
              (std::vector<std::string>{"\nDATE\nRX Frame: Time = 1.0\nCommand=1   SAPI=0x00\nTEI=0x00\n"
                                        "0x01 0x05  Receive Ready\nHex Dump: \n02 01 01 05 \n",
                                        "\nDATE\nRX Frame: Time = 1.0\n"
                                        "Oversized frame, frame will not be interpreted \nFrame Error \n"}));
}

TEST_F(ShowRecord, TakesAnyOtherDirectionForReceived) {
    show(7, 0, {0x00, 0x01, 0x73});
    EXPECT_EQ(log().substr(0, 31), "\nDATE\nRX Frame: Time = 0.0\nResp");
}

TEST_F(ShowRecord, WritesTheBoardsTimeInSecondsAndUnpaddedMilliseconds) {
    struct {
        unsigned int timestamp;
        const char* time;
    } const cases[] = {
        {0, "0.0"},
        {1, "0.4"},
        {249, "0.996"},
        {250, "1.0"},
        {3001, "12.4"},
        {3002, "12.8"},
        {3020, "12.80"},
        {3200, "12.800"},
        {2147483648U, "8589934.592"},
        {4294967295U, "17179869.180"},
    };
    std::string expected;
    for (const auto& each : cases) {
        show(received, each.timestamp, {});
        expected += std::string("\nDATE\nRX Frame: Time = ") + each.time + "\nHex Dump: \n\n";
    }
    EXPECT_EQ(log(), expected);
}

TEST_F(ShowRecord, WritesTheLocalTimeOfTheMoment) {
    setenv("TZ", "TST-5", 1);  // five hours ahead of UTC
    tzset();
    const std::time_t before = std::time(nullptr);
    show(received, 0, {});
    const std::time_t after = std::time(nullptr);
    std::tm shown{};
    const std::string text = log_.text();
    ASSERT_EQ(*strptime(text.c_str() + 1, "%a %b %e %H:%M:%S %Y", &shown), '\n') << text;
    const std::time_t then = timegm(&shown) - std::time_t{5} * 3600;
    EXPECT_LE(before, then);
    EXPECT_LE(then, after);
}

TEST_F(ShowRecord, ReportsAnotherKindOfEventOnTheScreenAlone) {
    for (const unsigned int label : {3U, 0U, 1U, 0x102U}) {
        Record rec;
        fill(rec, received, 250, {0x00, 0x01, 0x73});
        rec.Label = label;
        show(rec);
    }
    const std::string report = "ERROR - received unexpected rtc event\n";
    EXPECT_EQ(screen(), report + report + report + report);
    EXPECT_EQ(log(), "");
}

TEST_F(ShowRecord, DecodesAFrameOf257Octets) {
    Octets octets(257, 0x00);
    octets[2] = 0x6F;  // everything behind it is no layer 3 that says anything
    show(received, 0, octets);
    EXPECT_EQ(screen(), "");
    const std::string text = log();
    EXPECT_EQ(text.find("Oversized"), std::string::npos);
    const std::string dump = text.substr(text.find("Hex Dump: \n"));
    EXPECT_EQ(dump.substr(0, 42), "Hex Dump: \n00 00 6f 00 00 00 00 00 00 00 \n");
    EXPECT_EQ(dump.size(), std::string("Hex Dump: \n").size() + std::size_t{257} * 3 +
                               26);  // 25 lines of ten, one of seven
}

TEST_F(ShowRecord, RefusesALongerReceivedFrame) {
    for (const std::size_t length : {258U, 300U, 65535U})
        show(received, 250, Octets(length, 0x00));
    const std::string refused =
        "\nDATE\nRX Frame: Time = 1.0\n"
        "Oversized frame, frame will not be interpreted \n"
        "Frame Error \n";
    EXPECT_EQ(log(), refused + refused + refused);
    const std::string report = "Oversized frame, frame will not be interpreted\nFrame Error\n";
    EXPECT_EQ(screen(), report + report + report);
}

TEST_F(ShowRecord, RefusesALongerTransmittedFrameWithItsIndent) {
    show(transmitted, 250, Octets(300, 0x00));
    EXPECT_EQ(log(), "\n" + blanks + "DATE\n" + blanks + "TX Frame: Time = 1.0\n" + blanks +
                         "Oversized frame, frame will not be interpreted \n" + blanks + "Frame Error \n");
    EXPECT_EQ(screen(), "Oversized frame, frame will not be interpreted\nFrame Error\n");
}

TEST_F(ShowRecord, ShowsNoMoreThanTheListHolds) {
    Record rec;
    fill(rec, received, 0, {0x00, 0x01, 0x73});
    rec.Length = 200;
    show(rec);
    EXPECT_EQ(log(),
              "\nDATE\nRX Frame: Time = 0.0\n"
              "Response=0    SAPI=0x00\nTEI=0x00\n    0x73  Unnumbered Acknowledgment\n"
              "Hex Dump: \n00 01 73 \n");
}

TEST_F(ShowRecord, JudgesOversizeByTheAnnouncedLength) {
    Record rec;
    fill(rec, received, 250, {0x00, 0x01, 0x73});
    rec.Length = 258;
    show(rec);
    EXPECT_EQ(screen(), "Oversized frame, frame will not be interpreted\nFrame Error\n");
    EXPECT_EQ(log().find("Hex Dump"), std::string::npos);
}

TEST_F(ShowRecord, ShowsNoMoreThanTheAnnouncedLength) {
    Record rec;
    fill(rec, received, 0, {0x00, 0x01, 0x73, 0x08, 0x02, 0x00, 0x01, 0x05});
    rec.Length = 3;
    show(rec);
    EXPECT_EQ(log(),
              "\nDATE\nRX Frame: Time = 0.0\n"
              "Response=0    SAPI=0x00\nTEI=0x00\n    0x73  Unnumbered Acknowledgment\n"
              "Hex Dump: \n00 01 73 \n");
}

TEST_F(ShowRecord, TakesANegativeLengthForNone) {
    for (const unsigned int length : {0xFFFFFFFFU, 0x80000000U}) {
        Record rec;
        fill(rec, received, 0, {0x00, 0x01, 0x73});
        rec.Length = length;
        show(rec);
    }
    const std::string empty = "\nDATE\nRX Frame: Time = 0.0\nHex Dump: \n\n";
    EXPECT_EQ(log(), empty + empty);
    EXPECT_EQ(screen(), "");
}

TEST_F(ShowRecord, ShowsNothingOfTheRecordBefore) {
    show(received, 0, Octets(200, 0x11));
    const std::size_t before = log().size();
    show(received, 0, {0x00, 0x01, 0x73});
    EXPECT_EQ(log().substr(before),
              "\nDATE\nRX Frame: Time = 0.0\n"
              "Response=0    SAPI=0x00\nTEI=0x00\n    0x73  Unnumbered Acknowledgment\n"
              "Hex Dump: \n00 01 73 \n");
}

}  // namespace
}  // namespace app
