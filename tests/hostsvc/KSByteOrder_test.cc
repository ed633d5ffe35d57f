#include "hostsvc/KSByteOrder.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdint>

namespace {

using Octets = std::array<std::uint8_t, 12>;

constexpr Octets twelve{1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12};

struct Case {
    const char* says;
    int count;
    Octets expected;
};

const std::array cases{
    Case{"nothing below one word", 3, {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}},
    Case{"nothing of nothing", 0, {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}},
    Case{"nothing of a negative count", -8, {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}},
    Case{"one word", 4, {4, 3, 2, 1, 0, 0, 0, 0, 0, 0, 0, 0}},
    Case{"one word of six octets", 6, {4, 3, 2, 1, 0, 0, 0, 0, 0, 0, 0, 0}},
    Case{"three words", 12, {4, 3, 2, 1, 8, 7, 6, 5, 12, 11, 10, 9}},
};

TEST(KSByteOrder, WholeWordsAreReversedAndTheRestIsLeftAlone) {
    for (const Case& each : cases) {
        SCOPED_TRACE(each.says);
        Octets source = twelve;
        Octets there{};
        Octets back{};
        KS_htonU32(there.data(), source.data(), each.count);
        KS_ntohU32(back.data(), source.data(), each.count);
        EXPECT_EQ(there, each.expected);
        EXPECT_EQ(back, each.expected);
        EXPECT_EQ(source, twelve);
    }
}

TEST(KSByteOrder, SixOctetsInPlaceLeaveTheLastTwo) {
    Octets octets = twelve;
    KS_htonU32(octets.data(), octets.data(), 6);
    EXPECT_EQ(octets, (Octets{4, 3, 2, 1, 5, 6, 7, 8, 9, 10, 11, 12}));
    KS_ntohU32(octets.data(), octets.data(), 6);
    EXPECT_EQ(octets, twelve);
}

TEST(KSByteOrder, WordsNeedNoAlignment) {
    Octets octets = twelve;
    KS_htonU32(octets.data() + 1, octets.data() + 1, 4);
    EXPECT_EQ(octets, (Octets{1, 5, 4, 3, 2, 6, 7, 8, 9, 10, 11, 12}));
}

}  // namespace
