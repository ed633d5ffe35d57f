#include "capture/writers.h"

#include <gtest/gtest.h>

#include <thread>

#include "tests/capture/reading.h"
#include "tests/capture/writing.h"

namespace capture {
namespace {

using testing::frameOf;
using testing::itemOf;
using testing::itemsIn;
using testing::Octets;
using testing::WrittenFile;
using Kind = Item::Kind;

const Interface trunk{"trunk1", Variant::net5};
const Octets sabme{0x00, 0x01, 0x7f};
const Octets ua{0x00, 0x01, 0x73};
constexpr std::int64_t then = 1'795'260'333'300'000'004;

// Items that a form is given, and those that are read in what it makes of them.
template <typename Make, typename... Items>
std::string roundTrip(Make make, const Items&... items) {
    const WrittenFile file;
    const std::unique_ptr<Writer> writer = make(file.descriptor(), "written");
    (writer->write(items), ...);
    writer->finish();
    return itemsIn(file.path());
}

Item networkFrame() {
    Item item = frameOf(trunk, false, then, ua);
    item.frame.role = Role::network;
    return item;
}

TEST(PcapngWriterTest, FramesComeBackWithDirectionRoleAndTime) {
    EXPECT_EQ(roundTrip(makePcapngWriter, frameOf(trunk, true, then, sabme), networkFrame()),
              "frame 1 TX user 1795260333300ms 00017f\n"
              "frame 2 RX network 1795260333300ms 000173\n");
}

TEST(PcapngWriterTest, NanosecondsNamesAndVariantsComeBack) {
    const WrittenFile file;
    const auto writer = makePcapngWriter(file.descriptor(), "written");
    const Interface other{"trunk2", Variant::unknown};
    writer->write(frameOf(trunk, true, then, sabme));
    writer->write(frameOf(other, true, then + 1, sabme));
    writer->write(frameOf(trunk, true, then + 2, sabme));
    writer->finish();
    const auto reader = openReader(file.path(), {}, forms());
    Item item;
    for (const Interface& expected : {trunk, other, trunk}) {
        ASSERT_EQ(reader->next(item), Reader::Next::item);
        EXPECT_EQ(*item.frame.interface, expected);
    }
    EXPECT_EQ(item.frame.time, then + 2);
    EXPECT_EQ(reader->next(item), Reader::Next::end);
}

TEST(PcapngWriterTest, ABlockIsWhatTheFormatSays) {
    const WrittenFile file;
    const auto writer = makePcapngWriter(file.descriptor(), "written");
    writer->write(frameOf(trunk, true, 0x0000000123456789, sabme));
    writer->finish();
    // clang-format off
    const std::string expected =
        "0a0d0d0a" "2c000000" "4d3c2b1a" "0100" "0000" "ffffffffffffffff"  // a section
            "0400" "0700" "6c6170646d6f6e00" "00000000" "2c000000"
        "01000000" "4c000000" "b100" "0000" "00000000"                      // an interface
            "0200" "0600" "7472756e6b310000"
            "0300" "1b00" "4b5639204420" "6368616e6e656c2c20" "76617269616e7420" "6e657435" "00"
            "0900" "0100" "09000000" "00000000" "4c000000"
        "06000000" "40000000" "00000000" "01000000" "89674523" "13000000" "13000000"  // a packet
            "0004" "0000" "0000" "0000000000000000" "0030" "00017f" "00"
            "0200" "0400" "02000000" "00000000" "40000000";
    // clang-format on
    const std::string content = file.content();
    EXPECT_EQ(testing::hexOf(Octets(content.begin(), content.end())), expected);
}

TEST(PcapngWriterTest, TicksAndHostSecondComeBack) {
    Item item = frameOf(trunk, false, then, ua);
    item.frame.ticks = 4'294'967'295;
    item.frame.written = 1'795'260'333;
    EXPECT_EQ(roundTrip(makePcapngWriter, item),
              "frame 1 RX user 1795260333300ms t4294967295 w1795260333 000173\n");
}

TEST(PcapngWriterTest, ItemsBetweenFramesComeBackInTheirPlace) {
    EXPECT_EQ(roundTrip(makePcapngWriter, itemOf(trunk, Kind::run), itemOf(trunk, Kind::lost, 17),
                        frameOf(trunk, true, then, sabme), itemOf(trunk, Kind::notQueued),
                        itemOf(trunk, Kind::dropped, 3), itemOf(trunk, Kind::restart),
                        itemOf(trunk, Kind::unproved, 3, "x y"),
                        itemOf(trunk, Kind::comment, 0, "of the author"), frameOf(trunk, false, then, ua),
                        itemOf(trunk, Kind::lost, 2), itemOf(trunk, Kind::notTaken)),
              "run 1 net5\n"
              "lost 1 x17\n"
              "frame 1 TX user 1795260333300ms 00017f\n"
              "notQueued 2\n"
              "restart 2\n"
              "unproved 2 \"x y\"\n"
              "comment 2 \"of the author\"\n"
              "dropped 2 x3\n"
              "frame 2 RX user 1795260333300ms 000173\n"
              "lost 2 x2\n"
              "notTaken 2\n");
}

TEST(PcapngWriterTest, AHeadWithoutVariantStaysInFrontOfItsFrames) {
    const Interface unknown{"trunk1", Variant::unknown};
    EXPECT_EQ(roundTrip(makePcapngWriter, itemOf(unknown, Kind::run), frameOf(trunk, true, then, sabme)),
              "run 1 \nframe 1 TX user 1795260333300ms 00017f\n");
}

TEST(PcapngWriterTest, FramesThatWereNotCapturedWholeComeBackAsSuch) {
    Item oversized = frameOf(trunk, true, then, {});
    oversized.kind = Kind::oversized;
    Item cut = frameOf(trunk, false, then, ua);
    cut.kind = Kind::cut;
    cut.count = 20;
    EXPECT_EQ(roundTrip(makePcapngWriter, oversized, cut, frameOf(trunk, true, then, {})),
              "oversized 1 TX user 1795260333300ms \n"
              "cut 2 RX user 1795260333300ms 000173 x20 \"only 19 of its 36 octets were captured\"\n"
              "frame 3 TX user 1795260333300ms \n");
}

TEST(PcapngWriterTest, RelativeTimesStayRelative) {
    Item item = frameOf(trunk, true, 1'500'000'000, sabme);
    item.frame.clock = Clock::relative;
    EXPECT_EQ(roundTrip(makePcapngWriter, item), "frame 1 TX user +1500ms 00017f\n");
}

TEST(PcapngWriterTest, FramesWithoutTimesGetNone) {
    Item ticks = frameOf(trunk, true, 0, sabme);
    ticks.frame.clock = Clock::none;
    ticks.frame.ticks = 1095;
    Item nothing = frameOf(trunk, false, 0, ua);
    nothing.frame.clock = Clock::none;
    EXPECT_EQ(roundTrip(makePcapngWriter, ticks, nothing, frameOf(trunk, true, then, sabme)),
              "frame 1 TX user t1095 00017f\n"
              "frame 2 RX user 000173\n"
              "frame 3 TX user 1795260333300ms 00017f\n");
}

TEST(PcapngWriterTest, ACutFrameHasTheSecondInWhichItWasWritten) {
    Item cut = frameOf(trunk, false, 0, ua);
    cut.kind = Kind::cut;
    cut.frame.clock = Clock::none;
    cut.frame.written = 1795260333;
    EXPECT_TRUE(roundTrip(makePcapngWriter, cut).starts_with("cut 1 RX user 1795260333000ms w1795260333 "));
}

TEST(PcapngWriterTest, AFlushLeavesWholeBlocksInOneWrite) {
    int ends[2];
    ASSERT_EQ(pipe2(ends, O_DIRECT), 0);  // a read gives one write
    const auto writer = makePcapngWriter(ends[1], "pipe");
    writer->write(frameOf(trunk, true, then, sabme));
    writer->flush();
    writer->write(frameOf(trunk, true, then, sabme));
    writer->flush();
    std::string all(4096, '\0');
    EXPECT_EQ(read(ends[0], all.data(), all.size()), 0x2c + 0x4c + 0x40);
    EXPECT_EQ(read(ends[0], all.data(), all.size()), 0x40);
    close(ends[0]);
    close(ends[1]);
}

TEST(WritersTest, AFailedWriteIsReportedWithItsReason) {
    const int full = open("/dev/full", O_WRONLY | O_CLOEXEC);
    const auto writer = makePcapngWriter(full, "day.pcapng");
    writer->write(frameOf(trunk, true, then, sabme));
    try {
        writer->finish();
        ADD_FAILURE() << "no report";
    } catch (const WriteError& error) {
        EXPECT_STREQ(error.what(), "day.pcapng: No space left on device");
        EXPECT_EQ(error.reason, ENOSPC);
    }
    close(full);
}

TEST(PcapWriterTest, FramesComeBack) {
    EXPECT_EQ(roundTrip(makePcapWriter, frameOf(trunk, true, then, sabme), itemOf(trunk, Kind::lost, 3),
                        networkFrame()),
              "frame 1 TX user 1795260333300ms 00017f\n"
              "frame 2 RX network 1795260333300ms 000173\n");
    EXPECT_EQ(roundTrip(makePcapWriter), "");
}

TEST(HexWriterTest, IsReadableAndComesBack) {
    const WrittenFile file;
    const auto writer = makeHexWriter(file.descriptor(), "written");
    Item ticks = frameOf(trunk, false, 0, ua);
    ticks.frame.clock = Clock::none;
    ticks.frame.ticks = 1095;
    Item relative = frameOf(trunk, false, 12'345'000'000, ua);
    relative.frame.clock = Clock::relative;
    for (const Item& item : {frameOf(trunk, true, then, sabme), itemOf(trunk, Kind::lost, 3), relative, ticks,
                             itemOf(trunk, Kind::comment, 0, "two\nlines"), frameOf(trunk, true, then, {})})
        writer->write(item);
    writer->finish();
    EXPECT_EQ(file.content(),
              "TX 2026-11-21T11:25:33.300000004Z 00017f\n"
              "# lapdmon: Frames Lost: 3\n"
              "RX 12.345000000 000173\n"
              "RX 1095 000173\n"
              "# two.lines\n"
              "# a frame without octets\n");
    EXPECT_EQ(itemsIn(file.path()),
              "frame 1 TX 1795260333300ms 00017f\n"
              "frame 3 RX +12345ms 000173\n"
              "frame 4 RX t1095 000173\n");
}

}  // namespace
}  // namespace capture
