#include "calls/Durations.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "calls/Message.h"

namespace calls {

TEST(Durations, AreZeroWhileThereAreNone) {
    const Durations none;
    EXPECT_EQ(none.count(), 0U);
    EXPECT_EQ(none.quantile(0.5), 0);
    EXPECT_EQ(none.mean(), 0);
}

TEST(Durations, AreExactBelowASecond) {
    Durations durations;
    for (int i = 1; i <= 100; ++i)
        durations.add(i * 4 * millisecond);
    EXPECT_EQ(durations.count(), 100U);
    EXPECT_EQ(durations.quantile(0.5), 200 * millisecond);
    EXPECT_EQ(durations.quantile(0.95), 380 * millisecond);
    EXPECT_EQ(durations.longest(), 400 * millisecond);
    EXPECT_EQ(durations.mean(), 202 * millisecond);
}

TEST(Durations, HaveTheirOnlyValueAsEachQuantile) {
    Durations durations;
    durations.add(5900 * millisecond);
    EXPECT_EQ(durations.quantile(0.5), 5900 * millisecond);
}

TEST(Durations, CountANegativeOneAsZero) {
    Durations durations;
    durations.add(-5 * second);
    EXPECT_EQ(durations.quantile(1), 0);
    EXPECT_EQ(durations.count(), 1U);
}

TEST(Durations, AreWithinAFiveHundredthOfTheTrueQuantile) {
    std::mt19937_64 random(1);
    std::lognormal_distribution<double> lengths(11, 3);  // milliseconds; the median is one minute
    Durations durations;
    std::vector<std::int64_t> all;
    for (int i = 0; i < 20000; ++i) {
        all.push_back(static_cast<std::int64_t>(std::min(lengths(random), 1e12)) * millisecond);
        durations.add(all.back());
    }
    std::sort(all.begin(), all.end());
    for (const double share : {0.01, 0.25, 0.5, 0.75, 0.95, 0.999}) {
        const std::int64_t exact = all[static_cast<std::size_t>(std::ceil(share * 20000)) - 1];
        EXPECT_LE(durations.quantile(share), exact) << share;
        EXPECT_GE(durations.quantile(share), exact - exact / 500) << share;
    }
    EXPECT_EQ(durations.longest(), all.back());
}

}  // namespace calls
