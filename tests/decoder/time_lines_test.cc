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

TEST(LocalTimeText, OfAYearThatTheCLibraryCannotShowIsEmpty) {
    LocalTime time;
    EXPECT_EQ(time.of(std::time_t{1} << 62), "\n");
}

}  // namespace
}  // namespace decoder
