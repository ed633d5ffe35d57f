#include "reader/TimeText.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <filesystem>
#include <regex>

#include "reader/errors.h"
#include "reader/text.h"

namespace reader {

namespace {

constexpr std::int64_t nanosecondsPerSecond = 1'000'000'000;
constexpr std::int64_t nanosecondsPerMillisecond = 1'000'000;
constexpr std::int64_t nanosecondsPerMinute = 60 * nanosecondsPerSecond;

std::int64_t floorDivide(std::int64_t number, std::int64_t by) {
    return number / by - (number % by < 0 ? 1 : 0);
}

// `count` digits of a number, with leading zeros.
char* putDigits(char* at, std::int64_t number, int count) {
    for (int i = count; i-- > 0; number /= 10)
        at[i] = static_cast<char>('0' + number % 10);
    return at + count;
}

bool isKnownZone(const std::string& zone) {
    static const std::regex rule("[A-Za-z]{3,}[+-]?[0-9].*|<.+>[+-]?[0-9].*|UTC|GMT");
    std::error_code ignored;
    const bool leadsOutside = zone.find("..") != std::string::npos;
    return std::regex_match(zone, rule) ||
           (!zone.empty() && !leadsOutside &&
            std::filesystem::is_regular_file("/usr/share/zoneinfo/" + zone, ignored));
}

}  // namespace

void useTimeZone(const std::string& zone) {
    if (!isKnownZone(zone))
        throw UsageError("--tz: the system knows no time zone named " + zone);
    setenv("TZ", zone.c_str(), 1);
    tzset();
}

void TimeText::lookUp(std::int64_t minute) {
    minute_ = minute;
    const std::time_t seconds = minute * 60;
    std::tm local{};
    localtime_r(&seconds, &local);
    secondsAt_ = std::strftime(text_, sizeof text_, "%Y-%m-%dT%H:%M:", &local);
    const long east = local.tm_gmtoff / 60;
    char* at = text_ + secondsAt_ + 2;
    *at++ = '.';
    at += 3;
    *at++ = east < 0 ? '-' : '+';
    at = putDigits(at, std::labs(east) / 60, 2);
    *at++ = ':';
    at = putDigits(at, std::labs(east) % 60, 2);
    length_ = static_cast<std::size_t>(at - text_);
}

void TimeText::append(std::string& to, Instant instant) {
    if (instant.clock == capture::Clock::none) {
        to += '-';
        return;
    }
    if (instant.clock == capture::Clock::relative) {
        appendSeconds(to, instant.time);
        return;
    }
    const std::int64_t minute = floorDivide(instant.time, nanosecondsPerMinute);
    if (minute != minute_)
        lookUp(minute);
    const std::int64_t milliseconds =
        (instant.time - minute * nanosecondsPerMinute) / nanosecondsPerMillisecond;
    putDigits(text_ + secondsAt_, milliseconds / 1000, 2);
    putDigits(text_ + secondsAt_ + 3, milliseconds % 1000, 3);
    to.append(text_, length_);
}

std::string textOf(Instant instant) {
    std::string text;
    if (instant.clock != capture::Clock::none)
        TimeText().append(text, instant);
    return text;
}

SecondsText::SecondsText(std::int64_t nanoseconds) {
    const std::int64_t milliseconds = nanoseconds / nanosecondsPerMillisecond;
    auto rest = static_cast<std::uint64_t>(milliseconds < 0 ? -milliseconds : milliseconds);
    for (unsigned digits = 0; digits < 4 || rest != 0; ++digits, rest /= 10) {
        if (digits == 3)
            text_[--begin_] = '.';
        text_[--begin_] = static_cast<char>('0' + rest % 10);
    }
    if (milliseconds < 0)
        text_[--begin_] = '-';
}

void appendSeconds(std::string& to, std::int64_t nanoseconds) { to += SecondsText(nanoseconds).view(); }

namespace {

// The number in a part of a match; 0 if the part is absent.
int numberIn(const std::ssub_match& part) { return part.matched ? std::stoi(part.str()) : 0; }

// Nanoseconds of the digits after a decimal point: 250 ms for ".25".
std::int64_t fractionIn(const std::ssub_match& part) {
    std::string digits = part.matched ? part.str() : "0";
    digits.resize(9, '0');
    return std::stoll(digits);
}

void checkTimeOfDay(int hour, int minute, int second, const std::string& text) {
    if (hour > 23 || minute > 59 || second > 60)
        throw UsageError("no time of day: " + text);
}

std::int64_t absoluteIn(const std::smatch& part) {
    std::tm fields{};
    fields.tm_year = numberIn(part[1]) - 1900;
    fields.tm_mon = numberIn(part[2]) - 1;
    fields.tm_mday = numberIn(part[3]);
    fields.tm_hour = numberIn(part[4]);
    fields.tm_min = numberIn(part[5]);
    fields.tm_sec = numberIn(part[6]);
    fields.tm_isdst = -1;
    if (fields.tm_mon < 0 || fields.tm_mon > 11 || fields.tm_mday < 1 || fields.tm_mday > 31)
        throw UsageError("no date: " + part.str());
    checkTimeOfDay(fields.tm_hour, fields.tm_min, fields.tm_sec, part.str());
    std::time_t seconds = 0;
    if (!part[8].matched) {
        seconds = mktime(&fields);
    } else {
        seconds = timegm(&fields);
        if (part[9].matched) {
            const std::int64_t minutes = std::int64_t{numberIn(part[10])} * 60 + numberIn(part[11]);
            seconds -= (part[9].str() == "-" ? -60 : 60) * minutes;
        }
    }
    return seconds * nanosecondsPerSecond + fractionIn(part[7]);
}

}  // namespace

TimePoint::TimePoint(const std::string& text) {
    static const std::regex absolute(
        R"((\d{4})-(\d\d)-(\d\d)(?:[T ](\d\d):(\d\d)(?::(\d\d)(?:\.(\d{1,9}))?)?)?)"
        R"((Z|([+-])(\d\d):?(\d\d))?)");
    static const std::regex timeOfDay(R"((\d\d):(\d\d)(?::(\d\d)(?:\.(\d{1,9}))?)?)");
    static const std::regex sinceFirst(R"(\+(\d{1,9})(?:\.(\d{1,9}))?)");
    std::smatch part;
    if (std::regex_match(text, part, absolute)) {
        nanoseconds_ = absoluteIn(part);
    } else if (std::regex_match(text, part, timeOfDay)) {
        kind_ = Kind::timeOfDay;
        checkTimeOfDay(numberIn(part[1]), numberIn(part[2]), numberIn(part[3]), text);
        const int seconds = (numberIn(part[1]) * 60 + numberIn(part[2])) * 60 + numberIn(part[3]);
        nanoseconds_ = seconds * nanosecondsPerSecond + fractionIn(part[4]);
    } else if (std::regex_match(text, part, sinceFirst)) {
        kind_ = Kind::sinceFirst;
        nanoseconds_ = numberIn(part[1]) * nanosecondsPerSecond + fractionIn(part[2]);
    } else {
        throw UsageError("no time: " + text + " (2026-11-21T11:25:33+01:00, 2026-11-21, 11:25 or +12.5)");
    }
}

std::optional<std::int64_t> TimePoint::on(Instant first) const {
    if (kind_ == Kind::sinceFirst)
        return first.time + nanoseconds_;
    if (first.clock != capture::Clock::absolute)
        return std::nullopt;
    if (kind_ == Kind::absolute)
        return nanoseconds_;
    const std::time_t seconds = floorDivide(first.time, nanosecondsPerSecond);
    std::tm day{};
    localtime_r(&seconds, &day);
    const auto typed = static_cast<int>(nanoseconds_ / nanosecondsPerSecond);
    day.tm_hour = typed / 3600;
    day.tm_min = typed / 60 % 60;
    day.tm_sec = typed % 60;
    day.tm_isdst = -1;
    return mktime(&day) * nanosecondsPerSecond + nanoseconds_ % nanosecondsPerSecond;
}

}  // namespace reader
