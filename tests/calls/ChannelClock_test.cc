#include "calls/ChannelClock.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>

namespace calls {
namespace {

TEST(ChannelClock, StaysWithinItsNumbersWhateverTimesADamagedCaptureHas) {
    constexpr std::int64_t end = std::numeric_limits<std::int64_t>::max();
    constexpr std::int64_t year = 365 * 86400 * std::int64_t{1'000'000'000};
    ChannelClock clock;
    capture::Frame frame;
    frame.clock = capture::Clock::absolute;
    std::int64_t last = 0;
    for (const std::int64_t time : {std::int64_t{5}, end, std::int64_t{5}, end, -end, end}) {
        frame.time = time;
        const std::int64_t at = clock.at(frame);
        EXPECT_GE(at, last);
        EXPECT_LT(at, end - year);  // room for any timer
        last = at;
    }
    EXPECT_GT(last, end - 20 * year);
}

}  // namespace
}  // namespace calls
