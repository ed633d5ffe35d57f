#include "lapdlog/HostTime.h"

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <ctime>

#include "lapdlog/headers.h"

namespace lapdlog {

namespace {

constexpr std::array<std::string_view, 12> months{"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                                  "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
constexpr std::array<std::string_view, 7> weekdays{"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};

// The places of the parts of a date.
constexpr std::size_t monthAt = 4;
constexpr std::size_t dayAt = 8;
constexpr std::size_t hourAt = 11;
constexpr std::size_t minuteAt = 14;
constexpr std::size_t secondAt = 17;
constexpr std::size_t yearAt = 20;

// A number of so many digits; negative if the text is no number.
int numberAt(std::string_view date, std::size_t at, std::size_t digits) {
    int number = 0;
    for (const char c : date.substr(at, digits)) {
        if (c < '0' || '9' < c)
            return -1;
        number = number * 10 + (c - '0');
    }
    return number;
}

template <std::size_t N>
int indexOf(const std::array<std::string_view, N>& names, std::string_view name) {
    const auto* const found = std::find(names.begin(), names.end(), name);
    return found == names.end() ? -1 : static_cast<int>(found - names.begin());
}

bool hasBlanks(std::string_view date) {
    return date[3] == ' ' && date[7] == ' ' && date[10] == ' ' && date[13] == ':' && date[16] == ':' &&
           date[19] == ' ';
}

bool isDate(const std::tm& time) {
    const std::chrono::year_month_day date(std::chrono::year(time.tm_year + 1900),
                                           std::chrono::month(static_cast<unsigned>(time.tm_mon + 1)),
                                           std::chrono::day(static_cast<unsigned>(time.tm_mday)));
    return date.ok() && std::chrono::weekday(date).c_encoding() == static_cast<unsigned>(time.tm_wday);
}

// Reads a date without its seconds. Returns nothing for any other text.
std::optional<std::tm> minuteOf(std::string_view date) {
    std::tm time{};
    time.tm_wday = indexOf(weekdays, date.substr(0, 3));
    time.tm_mon = indexOf(months, date.substr(monthAt, 3));
    const bool isOneDigit = date[dayAt] == ' ';
    time.tm_mday = isOneDigit ? numberAt(date, dayAt + 1, 1) : numberAt(date, dayAt, 2);
    time.tm_hour = numberAt(date, hourAt, 2);
    time.tm_min = numberAt(date, minuteAt, 2);
    time.tm_year = numberAt(date, yearAt, 4) - 1900;
    const bool isGood = hasBlanks(date) && time.tm_wday >= 0 && time.tm_mon >= 0 && time.tm_mday > 0 &&
                        (isOneDigit || time.tm_mday > 9) && 0 <= time.tm_hour && time.tm_hour < 24 &&
                        0 <= time.tm_min && time.tm_min < 60 && 0 <= time.tm_year && time.tm_year < 300 &&
                        isDate(time);
    return isGood ? std::optional(time) : std::nullopt;
}

// The seconds since 1970, with summer time or without, or as the zone's rules say.
std::int64_t secondsOf(std::tm time, int summer) {
    time.tm_isdst = summer;
    return std::mktime(&time);
}

bool isLocally(std::int64_t seconds, const std::tm& wanted) {
    const std::time_t at = seconds;
    std::tm time{};
    return localtime_r(&at, &time) != nullptr && time.tm_min == wanted.tm_min &&
           time.tm_hour == wanted.tm_hour && time.tm_mday == wanted.tm_mday;
}

}  // namespace

// A time that does not exist, because summer time leaves it out, was written in another zone. The zone's
// rules decide what it becomes.
bool HostTime::setMinute(std::string_view date) {
    const std::optional<std::tm> time = minuteOf(date);
    if (!time)
        return false;
    const std::int64_t summer = secondsOf(*time, 1);
    const std::int64_t winter = secondsOf(*time, 0);
    beginnings_.fill(secondsOf(*time, -1));
    if (isLocally(summer, *time) && isLocally(winter, *time))
        beginnings_ = {summer, winter};
    return true;
}

std::optional<std::int64_t> HostTime::of(std::string_view date, std::optional<std::int64_t> expected) {
    if (date.size() != dateSize)
        return std::nullopt;
    const bool isSameMinute = minute_.size() == dateSize &&
                              date.substr(0, secondAt) == std::string_view(minute_).substr(0, secondAt) &&
                              date.substr(secondAt + 2) == std::string_view(minute_).substr(secondAt + 2);
    if (!isSameMinute) {
        minute_ = date;
        isGood_ = setMinute(date);
    }
    const int second = numberAt(date, secondAt, 2);
    if (!isGood_ || second < 0 || second > 60)
        return std::nullopt;
    std::int64_t beginning = beginnings_[0];
    if (expected && std::abs(beginnings_[1] + second - *expected) < std::abs(beginning + second - *expected))
        beginning = beginnings_[1];
    return beginning + second;
}

}  // namespace lapdlog
