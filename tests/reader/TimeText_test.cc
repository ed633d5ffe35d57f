#include "reader/TimeText.h"

#include <gtest/gtest.h>

#include "reader/errors.h"

namespace reader {
namespace {

constexpr std::int64_t second = 1'000'000'000;
constexpr std::int64_t ms = 1'000'000;
// 2026-11-21 11:25:33 UTC
constexpr std::int64_t november = 1'795'260'333;

Instant absolute(std::int64_t time) { return {capture::Clock::absolute, time}; }

// Each test has a zone of its own; the next test sets it anew.
std::string shown(Instant instant, const char* zone = "UTC") {
    useTimeZone(zone);
    std::string text;
    TimeText().append(text, instant);
    return text;
}

TEST(TimeText, ShowsDateTimeMillisecondsAndOffset) {
    EXPECT_EQ(shown(absolute(november * second + 300 * ms)), "2026-11-21T11:25:33.300+00:00");
    EXPECT_EQ(shown(absolute(november * second + 8 * ms), "Europe/Berlin"), "2026-11-21T12:25:33.008+01:00");
    EXPECT_EQ(shown(absolute(november * second), "America/St_Johns"), "2026-11-21T07:55:33.000-03:30");
}

TEST(TimeText, CutsPartsOfAMillisecondOff) {
    EXPECT_EQ(shown(absolute(november * second + ms - 1)), "2026-11-21T11:25:33.000+00:00");
}

TEST(TimeText, ShowsTimesBefore1970) { EXPECT_EQ(shown(absolute(-ms)), "1969-12-31T23:59:59.999+00:00"); }

TEST(TimeText, ShowsSecondsOfARelativeClock) {
    EXPECT_EQ(shown({capture::Clock::relative, 12 * second + 8 * ms}), "12.008");
    EXPECT_EQ(shown({}), "-");
}

// At 2026-10-25 01:00 UTC the clocks of Berlin go back from 03:00 to 02:00.
TEST(TimeText, TellsTheTwoHoursOfAnAutumnNightApart) {
    constexpr std::int64_t change = 1'792'890'000;
    useTimeZone("Europe/Berlin");
    TimeText times;
    std::string text;
    times.append(text, absolute((change - 1) * second));
    text += ' ';
    times.append(text, absolute((change + 3599) * second));
    EXPECT_EQ(text, "2026-10-25T02:59:59.000+02:00 2026-10-25T02:59:59.000+01:00");
}

TEST(Seconds, HaveASignAndThreeDigits) {
    const struct {
        std::int64_t nanoseconds;
        const char* text;
    } cases[] = {{0, "0.000"},
                 {40 * ms, "0.040"},
                 {-40 * ms, "-0.040"},
                 {-1, "0.000"},
                 {12 * second + 345 * ms, "12.345"},
                 {-3 * second, "-3.000"}};
    for (const auto& each : cases) {
        std::string text;
        appendSeconds(text, each.nanoseconds);
        EXPECT_EQ(text, each.text);
    }
}

TEST(TimeZone, IsRefusedIfTheSystemDoesNotKnowIt) {
    for (const char* const zone : {"", "Europe/Atlantis", "../../etc/passwd", "nowhere"})
        EXPECT_THROW(useTimeZone(zone), UsageError) << zone;
    EXPECT_NO_THROW(useTimeZone("CET-1CEST"));
}

TEST(TimePoint, TakesWhatPeopleType) {
    useTimeZone("Europe/Berlin");
    const Instant first = absolute(november * second + 500 * ms);  // 12:25:33.5 in Berlin
    const struct {
        const char* text;
        std::int64_t time;
    } cases[] = {{"2026-11-21T11:25:33Z", november * second},
                 {"2026-11-21T12:25:33", november * second},
                 {"2026-11-21 12:25:33.25", november * second + 250 * ms},
                 {"2026-11-21T06:55:33-04:30", november * second},
                 {"2026-11-21T12:25", (november - 33) * second},
                 {"2026-11-21", (november - 33 - 25 * 60 - 12 * 3600) * second},
                 {"12:25", (november - 33) * second},
                 {"12:25:34.5", (november + 1) * second + 500 * ms},
                 {"+12.5", (november + 13) * second}};
    for (const auto& each : cases)
        EXPECT_EQ(TimePoint(each.text).on(first), each.time) << each.text;
}

TEST(TimePoint, OfADateSaysNothingAboutAStreamOfRelativeTimes) {
    const Instant first{capture::Clock::relative, 5 * second};
    EXPECT_EQ(TimePoint("2026-11-21").on(first), std::nullopt);
    EXPECT_EQ(TimePoint("12:25").on(first), std::nullopt);
    EXPECT_EQ(TimePoint("+2").on(first), 7 * second);
}

TEST(TimePoint, RefusesEverythingElse) {
    for (const char* const text : {"", "noon", "2026-13-01", "2026-11-00", "25:00", "11:60", "2026-11-21T",
                                   "12", "-5", "+", "2026-11-21T11:25:33+1"})
        EXPECT_THROW(TimePoint{text}, UsageError) << text;
}

}  // namespace
}  // namespace reader
