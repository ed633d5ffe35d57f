// Reads the date of a log's time line.
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
    // Reads "Sat Nov 21 11:25:33 2026". Returns nothing for a text of another form, a wrong weekday, or a
    // year outside 1900 to 2199. In the hour that comes twice when summer time ends, it returns the second
    // that is nearer to `expected`.
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
