#include "isdn/Segments.h"

#include <gtest/gtest.h>

#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::hex;
using Outcome = Segments::Outcome;

Outcome add(Segments& segments, const char* message) {
    const auto octets = hex(message);
    return segments.add(parseLayer3(octets));
}

// A SETUP of reference 5 in three segments: 0x82 is the first of three, then 1 and 0 remain (Q.931 4.5.26).
// The second is cut within an element.
constexpr const char* first = "08 01 05 60 00 02 82 05 a1 04";
constexpr const char* second = "08 01 05 60 00 02 01 05 03 80 90";
constexpr const char* third = "08 01 05 60 00 02 00 05 a3 70 02 81 31";

TEST(Segments, PutAMessageTogether) {
    Segments segments;
    EXPECT_EQ(add(segments, first), Outcome::waiting);
    EXPECT_TRUE(segments.pending());
    EXPECT_EQ(add(segments, second), Outcome::waiting);
    EXPECT_EQ(add(segments, third), Outcome::complete);
    EXPECT_FALSE(segments.pending());
    EXPECT_FALSE(segments.dropped());
    const auto whole = hex("08 01 05 05 a1 04 03 80 90 a3 70 02 81 31");
    EXPECT_EQ(std::vector<std::uint8_t>(segments.message().begin(), segments.message().end()), whole);
}

TEST(Segments, LeaveOtherMessagesAlone) {
    Segments segments;
    EXPECT_EQ(add(segments, "08 01 05 7b"), Outcome::none);
    EXPECT_EQ(add(segments, "03 01 05 60 00 02 80 05"), Outcome::none);
    EXPECT_FALSE(segments.dropped());
}

TEST(Segments, DropWhatIsInterrupted) {
    const char* const interruptions[] = {
        "08 01 05 45",                 // another message
        third,                         // the second is missing
        first,                         // it begins anew
        "08 01 05 60 00 02 01 07 03",  // a segment of another message
        "08 01 05 60",                 // a segment without its element
        "08 01 05 60 00 01 01",        // half of one
    };
    for (const char* interruption : interruptions) {
        Segments segments;
        add(segments, first);
        const Outcome outcome = add(segments, interruption);
        EXPECT_TRUE(segments.dropped()) << interruption;
        EXPECT_NE(outcome, Outcome::complete) << interruption;
        EXPECT_EQ(segments.pending(), interruption == first) << interruption;
    }
}

TEST(Segments, AreStrayWithoutAFirst) {
    Segments segments;
    EXPECT_EQ(add(segments, second), Outcome::stray);
    EXPECT_EQ(add(segments, third), Outcome::stray);
    EXPECT_FALSE(segments.dropped());
    EXPECT_EQ(add(segments, "08 01 05 60 00 02 89 05 a1"), Outcome::stray) << "nine would follow";
}

TEST(Segments, OfOneBeginAndEndAtOnce) {
    Segments segments;
    EXPECT_EQ(add(segments, "08 01 05 60 00 02 80 05 a1"), Outcome::complete);
    EXPECT_EQ(segments.message().size(), 5U);
}

TEST(Segments, AreForgottenWhenTheirTimerEnds) {
    Segments segments;
    add(segments, first);
    segments.clear();
    EXPECT_FALSE(segments.pending());
    EXPECT_EQ(add(segments, second), Outcome::stray);
}

}  // namespace
