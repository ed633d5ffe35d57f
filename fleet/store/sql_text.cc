#include "fleet/store/sql_text.h"

#include <array>
#include <chrono>
#include <cstdio>

#include "capture/hex_digits.h"

namespace fleet {

namespace {

using std::chrono::sys_time;
using Nanoseconds = std::chrono::nanoseconds;

std::chrono::sys_days dayOf(std::int64_t nanoseconds) {
    return std::chrono::floor<std::chrono::days>(sys_time<Nanoseconds>(Nanoseconds(nanoseconds)));
}

}  // namespace

std::string dayText(std::int64_t nanoseconds) {
    const std::chrono::year_month_day date(dayOf(nanoseconds));
    std::array<char, 32> text{};
    static_cast<void>(std::snprintf(text.data(), text.size(), "%04d-%02u-%02u", int{date.year()},
                                    unsigned{date.month()}, unsigned{date.day()}));
    return text.data();
}

std::string timestampText(std::int64_t nanoseconds) {
    const sys_time<Nanoseconds> at{Nanoseconds(nanoseconds)};
    const std::chrono::hh_mm_ss time(std::chrono::floor<std::chrono::microseconds>(at - dayOf(nanoseconds)));
    std::array<char, 32> text{};
    static_cast<void>(
        std::snprintf(text.data(), text.size(), " %02d:%02d:%02d.%06d+00",
                      static_cast<int>(time.hours().count()), static_cast<int>(time.minutes().count()),
                      static_cast<int>(time.seconds().count()), static_cast<int>(time.subseconds().count())));
    return dayText(nanoseconds) + text.data();
}

std::string octetsText(const std::vector<std::uint8_t>& octets) {
    std::string text = "\\x";
    capture::appendDigits(octets, text);
    return text;
}

std::string printable(std::string_view text, std::size_t longest) {
    std::string shown(text.substr(0, longest));
    for (char& c : shown)
        c = c >= ' ' && c <= '~' ? c : '?';
    return shown;
}

}  // namespace fleet
