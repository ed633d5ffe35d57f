#include "decoder/time_lines.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "capture.h"

namespace decoder {
namespace {

using testing::blanks;
using testing::Capture;

TEST(TimeLines, OfAReceivedFrameStandFlushLeft) {
    Capture log(0, 0);
    timeLines(false, 250, "Sat Nov 21 11:25:33 2026\n");
    EXPECT_EQ(log.text(), "\nSat Nov 21 11:25:33 2026\nRX Frame: Time = 1.0\n");
    EXPECT_EQ(flag, 1);
}

TEST(TimeLines, OfATransmittedFrameAreIndentedButForTheEmptyLine) {
    Capture log(0, 1);
    timeLines(true, 3001, "Sat Nov 21 11:25:33 2026\n");
    EXPECT_EQ(log.text(), "\n" + blanks + "Sat Nov 21 11:25:33 2026\n" + blanks + "TX Frame: Time = 12.4\n");
    EXPECT_EQ(flag, 0);
}

TEST(TimeLines, ShowTheWholeRangeOfTheTimeStamp) {
    Capture log;
    timeLines(false, 4294967295U, "then\n");
    EXPECT_EQ(log.text(), "\nthen\nRX Frame: Time = 17179869.180\n");
}

TEST(LocalTimeText, IsTheCLibrarysFormAndALineEnd) {
    setenv("TZ", "UTC", 1);
    tzset();
    LocalTime time;
    EXPECT_EQ(time.of(1795260333), "Sat Nov 21 11:25:33 2026\n");
    EXPECT_EQ(time.of(1793491200), "Sun Nov  1 00:00:00 2026\n");
    EXPECT_EQ(time.of(1795260333), "Sat Nov 21 11:25:33 2026\n");
}

TEST(LocalTimeText, FollowsAZoneThatChangesWithinASecond) {
    setenv("TZ", "UTC", 1);
    tzset();
    LocalTime time;
    EXPECT_EQ(time.of(0), "Thu Jan  1 00:00:00 1970\n");
    setenv("TZ", "CET-1", 1);
    tzset();
    EXPECT_EQ(time.of(0), "Thu Jan  1 01:00:00 1970\n");
    setenv("TZ", "UTC", 1);
    tzset();
}

// The times at which offsets change, of zones that differ from UTC by hours, by minutes and by seconds.
TEST(LocalTimeText, IsTheCLibrarysOverEveryChangeOfAnOffset) {
    struct Change {
        const char* zone;
        std::time_t at;
    };
    constexpr Change changes[] = {
        {"Europe/Berlin", 1774746000},
        {"Europe/Berlin", 1793494800},
        {"Asia/Kolkata", 1795260333},
        {"Africa/Monrovia", 63593070},
        {"Australia/Lord_Howe", 1775314800},
        {"America/St_Johns", 562125660},
        {"Europe/Amsterdam", -1025741972},
        {"right/UTC", 1483228826},
        {"UTC", 0},
    };
    for (const Change& change : changes) {
        setenv("TZ", change.zone, 1);
        tzset();
        LocalTime time;
        for (const int step : {1, 7, -1, -13}) {
            for (int i = -130; i <= 130; ++i) {
                const std::time_t second = change.at + i * step;
                char expected[26];
                ASSERT_NE(ctime_r(&second, expected), nullptr);
                ASSERT_EQ(time.of(second), expected) << change.zone << " " << second;
            }
        }
    }
    setenv("TZ", "UTC", 1);
    tzset();
}

TEST(LocalTimeText, OfTheFirstMomentIsADateWhateverTheMoment) {
    for (const std::time_t second : {std::time_t{-1}, std::time_t{0}, std::time_t{1}})
        EXPECT_EQ(LocalTime().of(second).size(), 25U);
}

TEST(LocalTimeText, OfAYearThatTheCLibraryCannotShowIsEmpty) {
    LocalTime time;
    EXPECT_EQ(time.of(std::time_t{1} << 62), "\n");
}

}  // namespace
}  // namespace decoder
