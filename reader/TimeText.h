// Writes times for people, and reads times that people type.
#ifndef READER_TIME_TEXT_H
#define READER_TIME_TEXT_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "capture/Frame.h"

namespace reader {

// How the time of a frame is shown: date, time and offset; seconds since the first frame; or seconds since
// the frame that was shown before it.
enum class TimeForm { absolute, relative, delta };

// A time and what it counts from.
struct Instant {
    capture::Clock clock = capture::Clock::none;
    std::int64_t time = 0;  // nanoseconds
};

// Makes `zone` ("Europe/Berlin", "UTC", "CET-1CEST") the local time of the whole process, before threads
// start. Throws UsageError for a zone that the system does not know.
void useTimeZone(const std::string& zone);

// Writes times in the process's local time. Remembers the last minute, because looking up its offset takes
// longer than writing the rest. Used by one thread.
class TimeText {
  public:
    // Appends "2026-11-21T11:25:33.300+01:00", or seconds, "12.300", for a relative clock, or "-" without a
    // clock. Parts of a millisecond are cut off.
    void append(std::string& to, Instant instant);

  private:
    void lookUp(std::int64_t minute);

    std::int64_t minute_ = INT64_MIN;  // the minute of text_
    char text_[48] = {};               // "2026-11-21T11:25:SS.MMM+01:00"
    std::size_t secondsAt_ = 0;        // the index of the seconds
    std::size_t length_ = 0;
};

// The instant alone; empty without a clock.
std::string textOf(Instant instant);

// Signed seconds with three digits after the point: "0.040", "-1.000". Parts of a millisecond are cut off
// towards zero.
class SecondsText {
  public:
    explicit SecondsText(std::int64_t nanoseconds);
    std::string_view view() const { return {text_ + begin_, sizeof text_ - begin_}; }

  private:
    char text_[24] = {};  // filled from its end
    std::size_t begin_ = sizeof text_;
};

// Appends the text of SecondsText.
void appendSeconds(std::string& to, std::int64_t nanoseconds);

// What a user may give as a time: an ISO date with or without time and offset (local time without), a time of
// day (of the first frame's day), or "+" and seconds since the first frame.
class TimePoint {
  public:
    // Throws UsageError.
    explicit TimePoint(const std::string& text);

    // The point on the clock of a stream whose first frame has the time `first`. Nothing if that is unknown,
    // as for a date and a stream of relative times.
    std::optional<std::int64_t> on(Instant first) const;
    // Nanoseconds since 1970; nothing of a time that the first frame decides.
    std::optional<std::int64_t> absolute() const {
        return kind_ == Kind::absolute ? std::optional(nanoseconds_) : std::nullopt;
    }

  private:
    enum class Kind { absolute, timeOfDay, sinceFirst };

    Kind kind_ = Kind::absolute;
    std::int64_t nanoseconds_ = 0;
};

}  // namespace reader

#endif
