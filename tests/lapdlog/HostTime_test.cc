#include "lapdlog/HostTime.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <ctime>

namespace lapdlog {
namespace {

class HostTimeTest : public ::testing::Test {
  protected:
    HostTimeTest() {
        setenv("TZ", "CET-1CEST,M3.5.0,M10.5.0/3", 1);
        tzset();
    }
    ~HostTimeTest() override {
        setenv("TZ", "UTC", 1);
        tzset();
    }

    HostTime time_;
};

TEST_F(HostTimeTest, IsThatOfTheZone) {
    EXPECT_EQ(time_.of("Sat Nov 21 12:25:33 2026", std::nullopt), 1795260333);
    EXPECT_EQ(time_.of("Sat Nov 21 12:25:34 2026", std::nullopt), 1795260334);
    EXPECT_EQ(time_.of("Wed Jul  1 02:00:00 2026", std::nullopt), 1782864000);
}

TEST_F(HostTimeTest, InTheHourThatComesTwiceItIsTheOneNearerToTheExpectedTime) {
    // Summer time ends on 25 October 2026 at 01:00 UTC.
    EXPECT_EQ(time_.of("Sun Oct 25 02:30:00 2026", 1792888200), 1792888200);
    EXPECT_EQ(time_.of("Sun Oct 25 02:30:00 2026", 1792891800), 1792891800);
    EXPECT_EQ(time_.of("Sun Oct 25 02:30:01 2026", 1792891790), 1792891801);
    EXPECT_EQ(time_.of("Sun Oct 25 01:59:59 2026", 1792891790), 1792886399);
    EXPECT_EQ(time_.of("Sun Oct 25 03:00:00 2026", 1792886399), 1792893600);
}

TEST_F(HostTimeTest, ATextOfAnotherFormIsNoTime) {
    for (const char* text :
         {"", "Sat Nov 21 12:25:33 202", "Sat Nov 21 12:25:33 20266", "Sun Nov 21 12:25:33 2026",
          "Sat Nov 32 12:25:33 2026", "Sat nov 21 12:25:33 2026", "Sat Nov 21 24:25:33 2026",
          "Sat Nov 21 12:60:33 2026", "Sat Nov 21 12:25:61 2026", "Sat Nov 21-12:25:33 2026",
          "Sat Nov 21 12:25:3x 2026", "Sat Feb 30 12:25:33 2026", "Sat Nov 21 12:25:33 20x6",
          "Mon Jun 07 12:25:33 2027", "Wed Jan  1 00:00:00 2200", "Sun Dec 31 00:00:00 1899"})
        EXPECT_EQ(time_.of(text, std::nullopt), std::nullopt) << text;
}

}  // namespace
}  // namespace lapdlog
