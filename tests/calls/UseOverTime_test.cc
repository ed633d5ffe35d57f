#include "calls/UseOverTime.h"

#include <gtest/gtest.h>

namespace calls {

namespace {

constexpr auto absolute = capture::Clock::absolute;

Moment at(std::int64_t milliseconds, capture::Clock clock = absolute) {
    return {.clock = clock, .time = milliseconds * millisecond};
}

const UseOverTime::Step& step(const UseOverTime& use, std::int64_t number, capture::Clock clock = absolute) {
    return use.steps().at({clock, number});
}

TEST(UseOverTime, IsCountedInStepsOfASecond) {
    UseOverTime use;
    use.set(at(10'500), 1);
    use.set(at(11'250), 2);
    use.set(at(12'250), 0);
    EXPECT_EQ(use.width(), second);
    ASSERT_EQ(use.steps().size(), 3U);
    EXPECT_EQ(step(use, 10).used, 500 * millisecond);
    EXPECT_EQ(step(use, 10).most, 1U);
    EXPECT_EQ(step(use, 11).used, (250 + 2 * 750) * millisecond);
    EXPECT_EQ(step(use, 11).most, 2U);
    EXPECT_EQ(step(use, 12).used, 2 * 250 * millisecond);
    EXPECT_EQ(step(use, 12).most, 2U);
}

TEST(UseOverTime, CountsAUseThatEndsAtTheMomentItBegins) {
    UseOverTime use;
    use.set(at(3'100), 1);
    use.set(at(3'100), 2);
    use.set(at(3'100), 0);
    EXPECT_EQ(step(use, 3).most, 2U);
    EXPECT_EQ(step(use, 3).used, 0);
}

TEST(UseOverTime, PutsStepsTogetherWhenTheyWouldBeTooMany) {
    UseOverTime use;
    use.set(at(2'000), 1);
    use.set(at(4'000), 3);
    use.set(at(5'000), 0);
    use.set(at(UseOverTime::mostSteps * 1000 + 2'000), 1);
    use.set(at(UseOverTime::mostSteps * 1000 + 3'000), 0);
    EXPECT_EQ(use.width(), 5 * second);
    ASSERT_EQ(use.steps().size(), 2U);
    EXPECT_EQ(step(use, 0).used, (2 + 3) * second);
    EXPECT_EQ(step(use, 0).most, 3U);
    EXPECT_EQ(step(use, UseOverTime::mostSteps / 5).used, second);
}

TEST(UseOverTime, IsBoundedHoweverLongTheTraceIs) {
    UseOverTime use;
    for (std::int64_t day = 0; day < 20'000; ++day) {
        use.set(at(day * 86'400'000), 1);
        use.set(at(day * 86'400'000 + 1'000), 0);
    }
    EXPECT_LE(use.steps().size(), static_cast<std::size_t>(UseOverTime::mostSteps));
    std::int64_t used = 0;
    for (const auto& [key, each] : use.steps())
        used += each.used;
    EXPECT_EQ(used, 20'000 * second);
}

TEST(UseOverTime, KeepsClocksApartAndIgnoresChangesWithoutATime) {
    UseOverTime use;
    use.set(at(1'000, capture::Clock::none), 1);
    EXPECT_TRUE(use.steps().empty());
    use.set(at(1'000, capture::Clock::relative), 1);
    use.set(at(1'000'000'000'000), 1);  // another file: its clock does not go on from the first one's
    use.set(at(1'000'000'000'500), 0);
    EXPECT_EQ(use.width(), second);
    EXPECT_EQ(step(use, 1, capture::Clock::relative).used, 0);
    EXPECT_EQ(step(use, 1'000'000'000).used, 500 * millisecond);
}

TEST(UseOverTime, CountsUpToTheEndOfTime) {
    UseOverTime use;
    use.set({.clock = absolute, .time = 0}, 1);
    use.set({.clock = absolute, .time = INT64_MAX}, 2);
    use.set({.clock = absolute, .time = INT64_MAX}, 0);
    EXPECT_LE(use.steps().size(), static_cast<std::size_t>(UseOverTime::mostSteps));
    std::int64_t used = 0;
    for (const auto& [key, each] : use.steps())
        used += each.used;
    EXPECT_EQ(used, INT64_MAX);
    EXPECT_EQ(std::prev(use.steps().end())->second.most, 2U);
}

TEST(UseOverTime, TakesNothingBackWhenTimeGoesBack) {
    UseOverTime use;
    use.set(at(5'000), 1);
    use.set(at(-1'500), 2);
    use.set(at(-1'000), 0);
    EXPECT_EQ(step(use, 5).used, 0);
    EXPECT_EQ(step(use, -2).used, 2 * 500 * millisecond);
}

}  // namespace

}  // namespace calls
