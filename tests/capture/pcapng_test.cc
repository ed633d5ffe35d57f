// Captures of other writers: every order of octets, resolution and block.
#include "capture/pcapng.h"

#include <gtest/gtest.h>

#include "capture/pcap.h"
#include "tests/capture/reading.h"

namespace capture {
namespace {

using testing::itemsIn;
using testing::MemoryFile;

// A file that is put together of numbers, in either order of octets.
class Octets {
  public:
    explicit Octets(bool big = false) : big_(big) {}

    Octets& u(std::uint64_t value, int size) {
        for (int i = 0; i < size; ++i)
            text_ += static_cast<char>(value >> (8 * (big_ ? size - 1 - i : i)));
        return *this;
    }
    Octets& u16(std::uint64_t value) { return u(value, 2); }
    Octets& u32(std::uint64_t value) { return u(value, 4); }
    Octets& u64(std::uint64_t value) { return u(value, 8); }
    Octets& raw(std::string_view octets) {
        text_ += octets;
        while (text_.size() % 4 != 0)
            text_ += '\0';
        return *this;
    }
    Octets& option(int code, std::string_view value) { return u16(code).u16(value.size()).raw(value); }
    // A block around what `body` holds.
    Octets& block(std::uint32_t type, const Octets& body) {
        const std::size_t size = body.text_.size() + 12;
        u32(type).u32(size);
        text_ += body.text_;
        return u32(size);
    }
    Octets body() const { return Octets(big_); }
    const std::string& text() const { return text_; }

  private:
    bool big_;
    std::string text_;
};

Octets section(bool big = false) {
    Octets octets(big);
    return octets.block(0x0a0d0d0a, octets.body().u32(0x1a2b3c4d).u16(1).u16(0).u64(~0ULL));
}

Octets interface(const Octets& like, int type, const Octets& options) {
    return Octets(like).body().u16(type).u16(0).u32(0).raw(options.text());
}

Octets packet(const Octets& like, int interfaceNumber, std::uint64_t time, std::string_view octets,
              const Octets& options) {
    return like.body()
        .u32(interfaceNumber)
        .u32(time >> 32)
        .u32(time)
        .u32(octets.size())
        .u32(octets.size())
        .raw(octets)
        .raw(options.text());
}

constexpr std::string_view sabme("\x00\x01\x7f", 3);
constexpr std::string_view ua("\x00\x01\x73", 3);

std::string itemsOf(const Octets& octets) { return itemsIn(MemoryFile(octets.text()).path()); }

TEST(PcapngTest, EitherOrderOfOctetsIsRead) {
    for (const bool big : {false, true}) {
        Octets file = section(big);
        const Octets none = file.body();
        file.block(1, interface(file, 203, none)).block(6, packet(file, 0, 1'500'000, sabme, none));
        EXPECT_EQ(itemsOf(file), "frame 1 TX user 1500ms 00017f\n") << big;
    }
}

TEST(PcapngTest, ASectionMayHaveAnotherOrderAndInterfacesOfItsOwn) {
    Octets file = section();
    file.block(1, interface(file, 203, file.body())).block(6, packet(file, 0, 0, sabme, file.body()));
    Octets second = section(true);
    second.block(1, interface(second, 203, second.body().option(2, "b")));
    second.block(6, packet(second, 0, 0, ua, second.body()));
    file.raw(second.text());
    EXPECT_EQ(itemsOf(file), "frame 1 TX user 0ms 00017f\nframe 2 RX user 0ms 000173\n");
}

TEST(PcapngTest, TimesHaveTheResolutionAndOffsetOfTheirInterface) {
    const struct {
        std::string_view resolution;
        std::uint64_t units;
    } cases[] = {{"\x03", 1500},    {"\x09", 1'500'000'000}, {"\x0c", 1'500'000'000'000}, {"\x81", 3},
                 {"\x94", 3 << 19}, {"\xa8", 3ULL << 39},    {"\x7f", 1'500'000}};
    for (const auto& c : cases) {
        Octets file = section();
        file.block(1, interface(file, 203, file.body().option(9, c.resolution)));
        file.block(6, packet(file, 0, c.units, sabme, file.body()));
        EXPECT_EQ(itemsOf(file), "frame 1 TX user 1500ms 00017f\n")
            << testing::hexOf({reinterpret_cast<const std::uint8_t*>(c.resolution.data()), 1});
    }
    Octets file = section();
    file.block(1, interface(file, 203, file.body().option(14, std::string_view("\x0a\0\0\0\0\0\0\0", 8))));
    file.block(6, packet(file, 0, 1'500'000, sabme, file.body()));
    EXPECT_EQ(itemsOf(file), "frame 1 TX user 11500ms 00017f\n");
}

TEST(PcapngTest, TheFlagsOfAPacketTellTheDirectionWhereItsHeaderDoesNot) {
    Octets file = section();
    file.block(1, interface(file, 203, file.body()));
    file.block(6, packet(file, 0, 0, sabme, file.body().option(2, std::string_view("\x01\0\0\0", 4))));
    file.block(6, packet(file, 0, 0, sabme, file.body().option(2, std::string_view("\x02\0\0\0", 4))));
    EXPECT_EQ(itemsOf(file), "frame 1 RX 0ms 00017f\nframe 2 TX 0ms 00017f\n");
}

TEST(PcapngTest, NamesAndVariantsAreThoseOfTheInterface) {
    Octets file = section();
    file.block(1,
               interface(file, 203, file.body().option(2, "trunk7").option(3, "KV9 D channel, variant ni2")));
    file.block(6, packet(file, 0, 0, sabme, file.body()));
    const MemoryFile written(file.text());
    for (const auto& [options, expected] :
         {std::pair(ReadOptions{}, Interface{"trunk7", Variant::ni2}),
          {ReadOptions{.trunk = "mine"}, Interface{"mine", Variant::ni2}},
          {ReadOptions{.variant = Variant::ntt}, Interface{"trunk7", Variant::ntt}}}) {
        const auto reader = openReader(written.path(), options, forms());
        Item item;
        ASSERT_EQ(reader->next(item), Reader::Next::item);
        EXPECT_EQ(*item.frame.interface, expected);
    }
}

TEST(PcapngTest, DropsAndForeignCommentsBecomeItems) {
    Octets file = section();
    file.block(1, interface(file, 203, file.body()));
    file.block(
        6, packet(file, 0, 0, sabme,
                  file.body().option(1, "look here").option(4, std::string_view("\x05\0\0\0\0\0\0\0", 8))));
    file.block(5, file.body().u32(0).u64(0).option(5, std::string_view("\x09\0\0\0\0\0\0\0", 8)));
    EXPECT_EQ(itemsOf(file),
              "comment 1 \"look here\"\ndropped 1 x5\nframe 1 TX user 0ms 00017f\ndropped 1 x4\n");
}

TEST(PcapngTest, SimpleAndOldPacketsAreRead) {
    Octets file = section();
    file.block(1, interface(file, 203, file.body()));
    file.block(3, file.body().u32(3).raw(sabme));
    file.block(2, file.body().u16(0).u16(2).u32(0).u32(1'500'000).u32(3).u32(3).raw(ua));
    EXPECT_EQ(itemsOf(file), "frame 1 TX user 00017f\ndropped 2 x2\nframe 2 RX user 1500ms 000173\n");
}

TEST(PcapngTest, CheckSequencesAreLeftOut) {
    Octets file = section();
    file.block(1, interface(file, 203, file.body().option(13, "\x10")));
    file.block(6, packet(file, 0, 0, "\x02\x01\x7f\xaa\xbb", file.body()));
    EXPECT_EQ(itemsOf(file), "frame 1 RX user 0ms 02017f\n");
}

TEST(PcapngTest, PacketsOfOtherLinkTypesAreReportedAndSkipped) {
    Octets file = section();
    file.block(1, interface(file, 203, file.body())).block(1, interface(file, 1, file.body()));
    file.block(6, packet(file, 1, 0, "0123", file.body())).block(6, packet(file, 0, 0, sabme, file.body()));
    EXPECT_EQ(itemsOf(file),
              "damaged 0 \"packets of interface 1 are passed over: link type 1 (EN10MB); a D-channel capture "
              "has 177 "
              "(LINUX_LAPD) or 203 (LAPD)\"\nframe 2 TX user 0ms 00017f\n");
    Octets alone = section();
    alone.block(1, interface(alone, 1, alone.body()));
    EXPECT_EQ(itemsOf(alone),
              "!: link type 1 (EN10MB); a D-channel capture has 177 (LINUX_LAPD) or 203 (LAPD)\n");
}

TEST(PcapngTest, DamageIsReportedWithItsPlace) {
    Octets file = section();
    file.block(1, interface(file, 203, file.body())).block(6, packet(file, 0, 0, sabme, file.body()));
    const std::string frame = "frame 1 TX user 0ms 00017f\n";
    EXPECT_EQ(itemsOf(Octets(file).u32(6).u32(13).u32(0)),
              frame + "damaged 1 \"bad block of 13 octets; nothing is read from here on\"\n");
    EXPECT_EQ(itemsOf(Octets(file).block(6, file.body().u32(0))),
              frame + "damaged 2 \"bad packet block; it is passed over\"\n");
    EXPECT_EQ(itemsOf(Octets(file).block(6, packet(file, 7, 0, sabme, file.body()))),
              frame + "damaged 2 \"a packet of interface 7, which is not described, is passed over\"\n");
    EXPECT_EQ(itemsOf(Octets(file).u32(6)),
              frame + "damaged 1 \"truncated dump file: it ends within a block's header\"\n");
}

TEST(PcapTest, EitherOrderUnitAndHeaderIsRead) {
    for (const bool big : {false, true}) {
        for (const auto& [magic, unit, more] :
             {std::tuple(0xa1b2c3d4U, 1, 0), {0xa1b23c4dU, 1000, 0}, {0xa1b2cd34U, 1, 8}}) {
            Octets file(big);
            file.u32(magic).u16(2).u16(4).u64(0).u32(65535).u32(203);
            file.u32(1)
                .u32(500'000U * static_cast<unsigned>(unit))
                .u32(4)
                .u32(4)
                .raw(std::string(static_cast<std::size_t>(more), '\0'));
            file.raw(std::string_view("\x00\x01\x01\x01", 4));
            EXPECT_EQ(itemsOf(file), "frame 1 TX user 1500ms 00010101\n") << big << magic;
        }
    }
}

// Every input of the examples and of these tests, cut at every length: nothing crashes, and what comes is the
// beginning of what comes of the whole.
TEST(CutCaptures, GiveTheFramesThatAreWhole) {
    std::vector<std::string> inputs;
    for (const char* name : {"net5", "ni2"}) {
        std::ifstream file(LAPDMON_SOURCE_DIR "/examples/" + std::string(name) + ".pcap", std::ios::binary);
        inputs.emplace_back(std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>());
    }
    Octets mixed = section();
    mixed.block(1, interface(mixed, 203, mixed.body().option(2, "trunk7")));
    mixed.block(6, packet(mixed, 0, 0, sabme, mixed.body().option(1, "lapdmon: Frames Lost: 3")));
    mixed.block(3, mixed.body().u32(3).raw(ua)).block(5, mixed.body().u32(0).u64(0).option(1, "end"));
    inputs.push_back(mixed.text());
    for (const std::string& whole : inputs) {
        const std::string all = itemsIn(MemoryFile(whole).path());
        const std::size_t step = whole.size() <= 2048 ? 1 : whole.size() / 500;
        for (std::size_t size = 0; size < whole.size(); size += step) {
            const std::string items = itemsIn(MemoryFile(whole.substr(0, size)).path());
            const std::size_t last = items.size() < 2 ? 0 : items.rfind('\n', items.size() - 2) + 1;
            EXPECT_TRUE(all.starts_with(items) || all.starts_with(items.substr(0, last))) << size << "\n"
                                                                                          << items;
        }
    }
}

}  // namespace
}  // namespace capture
