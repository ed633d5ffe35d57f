#include "lapdlog/BoardClock.h"

#include <gtest/gtest.h>

namespace lapdlog {
namespace {

using Verdict = BoardClock::Verdict;

constexpr std::int64_t second = 1'000'000'000;
constexpr std::int64_t tick = 4'000'000;

TEST(BoardClockTest, DifferencesAreThoseOfTheTicks) {
    BoardClock clock;
    EXPECT_EQ(clock.take(1000, 500), Verdict::goesOn);
    EXPECT_EQ(clock.time(), 500 * second);
    for (std::uint32_t i = 1; i < 250; ++i) {
        clock.take(1000 + i, 500);
        EXPECT_EQ(clock.time(), 500 * second + i * tick);
    }
    clock.take(1250, 501);
    EXPECT_EQ(clock.time(), 501 * second);
}

TEST(BoardClockTest, TextThatWasWrittenLateDoesNotMoveTheTime) {
    BoardClock clock;
    clock.take(0, 500);
    clock.take(250, 508);
    EXPECT_EQ(clock.time(), 501 * second);
    clock.take(2500, 530);
    EXPECT_EQ(clock.time(), 510 * second);
}

TEST(BoardClockTest, ALateBeginningIsCorrectedToASecond) {
    BoardClock clock;
    clock.take(0, 508);
    clock.take(250, 501);
    EXPECT_LT(clock.time(), 502 * second);
    EXPECT_GE(clock.time(), 501 * second);
}

TEST(BoardClockTest, AnHourAgoIsForgotten) {
    // The board's clock loses 1 in 250, 14.4 s an hour.
    BoardClock clock;
    std::int64_t host = 1000;
    for (std::uint32_t ticks = 0; ticks < 3 * 900'000; ticks += 249, ++host)
        clock.take(ticks, host);
    const double late = static_cast<double>((host - 1) * second - clock.time()) / 1e9;
    EXPECT_NEAR(late, 14.4, 0.2) << "as much as an hour's drift";
}

TEST(BoardClockTest, AWrapGoesOn) {
    BoardClock clock;
    clock.take(0xffffff00, 500);
    EXPECT_EQ(clock.take(0x100, 502), Verdict::goesOn);
    EXPECT_EQ(clock.time(), 500 * second + 512 * tick);
}

TEST(BoardClockTest, AFallThatTheHostsTimeDoesNotAgreeWithIsARestart) {
    BoardClock clock;
    clock.take(0xffffff00, 500);
    EXPECT_EQ(clock.take(0x100, 500 + 86400), Verdict::restarted);
    EXPECT_EQ(clock.time(), (500 + 86400) * second);
}

TEST(BoardClockTest, AFallOf8MillisecondsIsNoRestart) {
    BoardClock clock;
    clock.take(1000, 500);
    EXPECT_EQ(clock.take(998, 500), Verdict::goesOn);
    EXPECT_EQ(clock.time(), 500 * second - 2 * tick);
    EXPECT_EQ(clock.take(995, 500), Verdict::restarted);
}

TEST(BoardClockTest, ALongSilenceGoesOn) {
    BoardClock clock;
    clock.take(0, 500);
    EXPECT_EQ(clock.take(250 * 86400, 500 + 86400), Verdict::goesOn);
    EXPECT_EQ(clock.time(), (500 + 86400) * second);
}

TEST(BoardClockTest, TicksThatLeapAndReturnAreThoseOfAnotherTrace) {
    BoardClock clock;
    clock.take(1000, 500);
    EXPECT_EQ(clock.take(900'000, 500), Verdict::goesOn);
    EXPECT_EQ(clock.time(), 500 * second);
    EXPECT_EQ(clock.take(1250, 501), Verdict::otherTrace);
    EXPECT_EQ(clock.time(), 501 * second);
    EXPECT_EQ(clock.take(900'250, 501), Verdict::otherTrace);
    EXPECT_EQ(clock.time(), 501 * second);
}

}  // namespace
}  // namespace lapdlog
