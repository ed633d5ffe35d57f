#include "reader/browse/PerMinute.h"

#include <gtest/gtest.h>

namespace reader::browse {
namespace {

constexpr std::int64_t second = calls::second;

TEST(PerMinute, CountsTheLastSixtySeconds) {
    PerMinute rate;
    for (std::int64_t i = 0; i < 120; ++i)
        rate.count(i * second);
    EXPECT_EQ(rate.upTo(119 * second), 60U);
    EXPECT_EQ(rate.upTo(149 * second), 30U);
    EXPECT_EQ(rate.upTo(178 * second), 1U);
    EXPECT_EQ(rate.upTo(179 * second), 0U);
}

TEST(PerMinute, ForgetsAllAfterALongPause) {
    PerMinute rate;
    rate.count(5 * second);
    rate.count(5 * second + 1);
    EXPECT_EQ(rate.upTo(5 * second), 2U);
    EXPECT_EQ(rate.upTo(86'400 * second), 0U);
    rate.count(86'400 * second);
    EXPECT_EQ(rate.upTo(86'400 * second), 1U);
}

TEST(PerMinute, ATimeThatGoesBackAMomentCountsWithTheNewest) {
    PerMinute rate;
    rate.count(100 * second);
    rate.count(99 * second);
    EXPECT_EQ(rate.upTo(100 * second), 2U);
}

}  // namespace
}  // namespace reader::browse
