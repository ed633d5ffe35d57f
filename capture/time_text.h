// Reads and writes times as text.
#ifndef CAPTURE_TIME_TEXT_H
#define CAPTURE_TIME_TEXT_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "capture/Frame.h"

namespace capture {

struct ToldTime {
    Clock clock = Clock::none;
    std::int64_t time = 0;  // nanoseconds

    bool operator==(const ToldTime&) const = default;
};

// Reads "2026-11-21T11:25:33.300+01:00", "11:25:33.300" or "12.345", and returns nothing for any other text.
// A blank may replace the T, and Z the offset. A date without offset is in this host's zone.
std::optional<ToldTime> timeIn(std::string_view text);

// "2026-11-21T11:25:33.300000000Z", or "12.345000000" for a time that is not absolute.
std::string toText(const ToldTime& time);

// Removes a number of exactly so many decimal digits from the front of the text and returns it. Returns
// nothing, and leaves the text alone, if it does not begin with them.
std::optional<int> takeDigits(std::string_view& text, std::size_t digits);
// Removes a time like "11:25:33.300" from the front of the text and returns it in nanoseconds. Returns
// nothing if there is none.
std::optional<std::int64_t> takeTimeOfDay(std::string_view& text);

}  // namespace capture

#endif
