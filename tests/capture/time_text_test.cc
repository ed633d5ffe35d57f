#include "capture/time_text.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <ctime>

namespace capture {
namespace {

TEST(TimeText, IsReadInTheseForms) {
    setenv("TZ", "CET-1CEST,M3.5.0,M10.5.0/3", 1);
    tzset();
    constexpr std::int64_t ms = 1'000'000;
    struct {
        const char* text;
        ToldTime time;
    } const cases[] = {
        {"2026-11-21T11:25:33Z", {Clock::absolute, 1795260333000 * ms}},
        {"2026-11-21 11:25:33Z", {Clock::absolute, 1795260333000 * ms}},
        {"2026-11-21T11:25:33.004Z", {Clock::absolute, 1795260333004 * ms}},
        {"2026-11-21T12:25:33+01:00", {Clock::absolute, 1795260333000 * ms}},
        {"2026-11-21T06:25:33-0500", {Clock::absolute, 1795260333000 * ms}},
        {"2026-11-21T12:25:33", {Clock::absolute, 1795260333000 * ms}},
        {"2026-07-01T02:00:00", {Clock::absolute, 1782864000000 * ms}},
        {"11:25:33.25", {Clock::relative, 41133250 * ms}},
        {"0.000000001", {Clock::relative, 1}},
        {"12.3450000009", {Clock::relative, 12345 * ms}},
    };
    for (const auto& c : cases)
        EXPECT_EQ(timeIn(c.text), c.time) << c.text;
    setenv("TZ", "UTC", 1);
    tzset();
}

TEST(TimeText, ATextOfAnotherFormIsNoTime) {
    for (const char* text : {"", "12", "12.", ".5", "2026-13-01T00:00:00Z", "2026-02-30T00:00:00Z",
                             "2026-11-21", "11:25", "24:00:00", "2026-11-21T11:25:33+1",
                             "2026-11-21T11:25:33Zz", "1500-01-01T00:00:00Z", "99999999999.5", "abc"})
        EXPECT_EQ(timeIn(text), std::nullopt) << text;
}

TEST(TimeText, IsWrittenWithNineDigits) {
    EXPECT_EQ(toText({Clock::absolute, 1795260333004000001}), "2026-11-21T11:25:33.004000001Z");
    EXPECT_EQ(toText({Clock::absolute, -1}), "1969-12-31T23:59:59.999999999Z");
    EXPECT_EQ(toText({Clock::relative, 12345000000}), "12.345000000");
}

}  // namespace
}  // namespace capture
