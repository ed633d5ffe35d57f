// Times as text.
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

// "2026-11-21T11:25:33.300+01:00" (a blank for the T, Z for the offset; without offset in this host's zone),
// "11:25:33.300" or "12.345". Nothing for any other text.
std::optional<ToldTime> timeIn(std::string_view text);

// "2026-11-21T11:25:33.300000000Z", or "12.345000000" for a time that is not absolute.
std::string toText(const ToldTime& time);

// Takes a whole number of exactly so many decimal digits off the front of the text; nothing, and the text as
// it was, when they are not there.
std::optional<int> takeDigits(std::string_view& text, std::size_t digits);
// "11:25:33.300" off the front, as nanoseconds.
std::optional<std::int64_t> takeTimeOfDay(std::string_view& text);

}  // namespace capture

#endif
