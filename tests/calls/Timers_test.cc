#include "calls/Timers.h"

#include <gtest/gtest.h>

namespace calls {

TEST(Timers, AreSetByNameWithUnits) {
    Timers timers;
    setTimer(timers, "T305=12");
    setTimer(timers, "t316=500ms");
    setTimer(timers, "T307=2min");
    setTimer(timers, "T304-user=7s");
    EXPECT_EQ(timers.t305, 12 * second);
    EXPECT_EQ(timers.t316, 500 * millisecond);
    EXPECT_EQ(timers.t307, 120 * second);
    EXPECT_EQ(timers.t304User, 7 * second);
    EXPECT_EQ(timers.t304Network, 20 * second);
}

TEST(Timers, OfBothSidesAreSetTogether) {
    Timers timers;
    setTimer(timers, "T310=11s");
    EXPECT_EQ(timers.t310User, 11 * second);
    EXPECT_EQ(timers.t310Network, 11 * second);
}

TEST(Timers, RefuseUnknownTimersAndDurations) {
    Timers timers;
    for (const char* bad :
         {"", "T305", "T305=", "T305=soon", "T305=-1", "T305=0", "T305=1h", "T99=1", "=1", "T305=1e30"})
        EXPECT_THROW(setTimer(timers, bad), BadTimer) << bad;
}

}  // namespace calls
