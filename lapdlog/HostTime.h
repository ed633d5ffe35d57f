// The second in which a log was written, from its text.
#ifndef LAPDLOG_HOST_TIME_H
#define LAPDLOG_HOST_TIME_H

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace lapdlog {

// Turns local time, in this host's zone (TZ), into seconds since 1970. Used by one thread at a time.
class HostTime {
  public:
    // Of "Sat Nov 21 11:25:33 2026"; nothing for a text that is no such date, whose weekday is not the
    // date's, or whose year is not 1900 to 2199. In the hour that comes twice when summer time ends, the one
    // nearer to `expected` counts.
    std::optional<std::int64_t> of(std::string_view date, std::optional<std::int64_t> expected);

  private:
    bool setMinute(std::string_view date);

    // Frames of one minute share what its beginning can be.
    std::string minute_;
    std::array<std::int64_t, 2> beginnings_{};
    bool isGood_ = false;
};

}  // namespace lapdlog

#endif
