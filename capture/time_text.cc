#include "capture/time_text.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <chrono>
#include <cstdio>
#include <ctime>

namespace capture {

namespace {

constexpr std::int64_t perSecond = 1'000'000'000;

bool isDigit(char c) { return '0' <= c && c <= '9'; }

bool take(std::string_view& text, char c) {
    if (text.empty() || text.front() != c)
        return false;
    text.remove_prefix(1);
    return true;
}

// ".300" as nanoseconds; digits after the ninth are ignored. 0 if there is no fraction.
std::int64_t takeFraction(std::string_view& text) {
    if (text.size() < 2 || text[0] != '.' || !isDigit(text[1]))
        return 0;
    text.remove_prefix(1);
    std::int64_t nanoseconds = 0;
    for (std::int64_t place = perSecond / 10; !text.empty() && isDigit(text.front()); place /= 10) {
        nanoseconds += (text.front() - '0') * place;
        text.remove_prefix(1);
    }
    return nanoseconds;
}

std::optional<std::chrono::year_month_day> takeDate(std::string_view& text) {
    const auto year = takeDigits(text, 4);
    const bool hasMonth = year && take(text, '-');
    const auto month = hasMonth ? takeDigits(text, 2) : std::nullopt;
    const bool hasDay = month && take(text, '-');
    const auto day = hasDay ? takeDigits(text, 2) : std::nullopt;
    if (!day)
        return std::nullopt;
    const std::chrono::year_month_day date(std::chrono::year(*year),
                                           std::chrono::month(static_cast<unsigned>(*month)),
                                           std::chrono::day(static_cast<unsigned>(*day)));
    return date.ok() ? std::optional(date) : std::nullopt;
}

// "Z", "+01:00", "-0500", as seconds; `isTold` says whether there is one.
std::int64_t takeOffset(std::string_view& text, bool& isTold) {
    isTold = take(text, 'Z');
    if (isTold || text.empty() || (text.front() != '+' && text.front() != '-'))
        return 0;
    const int sign = text.front() == '-' ? -1 : 1;
    text.remove_prefix(1);
    const auto hours = takeDigits(text, 2);
    static_cast<void>(take(text, ':'));
    const auto minutes = hours ? takeDigits(text, 2) : std::nullopt;
    isTold = minutes.has_value();
    return isTold ? std::int64_t{sign} * (*hours * 3600 + *minutes * 60) : 0;
}

std::int64_t localSeconds(const std::chrono::year_month_day& date, std::int64_t secondsOfDay) {
    std::tm broken{};
    broken.tm_year = static_cast<int>(date.year()) - 1900;
    broken.tm_mon = static_cast<int>(static_cast<unsigned>(date.month())) - 1;
    broken.tm_mday = static_cast<int>(static_cast<unsigned>(date.day()));
    broken.tm_sec = static_cast<int>(secondsOfDay);
    broken.tm_isdst = -1;
    return std::mktime(&broken);
}

// Dates that nanoseconds in 64 bits reach.
bool isInReach(const std::chrono::year_month_day& date) {
    return date.year() > std::chrono::year(1900) && date.year() < std::chrono::year(2200);
}

std::optional<ToldTime> dateAndTimeIn(std::string_view text) {
    const auto date = takeDate(text);
    if (!date || !isInReach(*date) || !(take(text, 'T') || take(text, ' ')))
        return std::nullopt;
    const auto ofDay = takeTimeOfDay(text);
    if (!ofDay)
        return std::nullopt;
    bool hasOffset = false;
    const std::int64_t offset = takeOffset(text, hasOffset);
    if (!text.empty())
        return std::nullopt;
    const std::int64_t seconds = *ofDay / perSecond;
    const std::int64_t utc =
        hasOffset
            ? std::chrono::sys_days(*date).time_since_epoch() / std::chrono::seconds(1) + seconds - offset
            : localSeconds(*date, seconds);
    return ToldTime{Clock::absolute, utc * perSecond + *ofDay % perSecond};
}

}  // namespace

std::optional<int> takeDigits(std::string_view& text, std::size_t digits) {
    if (text.size() < digits ||
        !std::all_of(text.begin(), text.begin() + static_cast<std::ptrdiff_t>(digits), isDigit))
        return std::nullopt;
    int number = 0;
    for (std::size_t i = 0; i < digits; ++i)
        number = number * 10 + (text[i] - '0');
    text.remove_prefix(digits);
    return number;
}

std::optional<std::int64_t> takeTimeOfDay(std::string_view& text) {
    std::string_view rest = text;
    const auto hours = takeDigits(rest, 2);
    const bool hasMinutes = hours && take(rest, ':');
    const auto minutes = hasMinutes ? takeDigits(rest, 2) : std::nullopt;
    const bool hasSeconds = minutes && take(rest, ':');
    const auto seconds = hasSeconds ? takeDigits(rest, 2) : std::nullopt;
    if (!seconds || *hours > 23 || *minutes > 59 || *seconds > 60)
        return std::nullopt;
    const std::int64_t fraction = takeFraction(rest);
    text = rest;
    return (*hours * 3600 + *minutes * 60 + *seconds) * perSecond + fraction;
}

std::optional<ToldTime> timeIn(std::string_view text) {
    std::string_view rest = text;
    if (const auto ofDay = takeTimeOfDay(rest); ofDay && rest.empty())
        return ToldTime{Clock::relative, *ofDay};
    rest = text;
    std::uint32_t seconds = 0;
    const auto [end, error] = std::from_chars(rest.data(), rest.data() + rest.size(), seconds);
    if (error == std::errc()) {
        rest.remove_prefix(static_cast<std::size_t>(end - rest.data()));
        if (rest.size() > 1 && rest.front() == '.') {
            const std::int64_t fraction = takeFraction(rest);
            if (rest.empty())
                return ToldTime{Clock::relative, seconds * perSecond + fraction};
        }
    }
    return dateAndTimeIn(text);
}

std::string toText(const ToldTime& time) {
    std::array<char, 64> text{};
    const std::int64_t seconds = time.time / perSecond - (time.time % perSecond < 0 ? 1 : 0);
    const std::int64_t fraction = time.time - seconds * perSecond;
    if (time.clock != Clock::absolute) {
        (void)std::snprintf(text.data(), text.size(), "%lld.%09lld", static_cast<long long>(seconds),
                            static_cast<long long>(fraction));
        return text.data();
    }
    const auto days =
        std::chrono::floor<std::chrono::days>(std::chrono::sys_seconds(std::chrono::seconds(seconds)));
    const std::chrono::year_month_day date(days);
    const long long ofDay = seconds - days.time_since_epoch() / std::chrono::seconds(1);
    (void)std::snprintf(text.data(), text.size(), "%04d-%02u-%02uT%02lld:%02lld:%02lld.%09lldZ",
                        static_cast<int>(date.year()), static_cast<unsigned>(date.month()),
                        static_cast<unsigned>(date.day()), ofDay / 3600, ofDay / 60 % 60, ofDay % 60,
                        static_cast<long long>(fraction));
    return text.data();
}

}  // namespace capture
