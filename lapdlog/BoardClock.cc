#include "lapdlog/BoardClock.h"

#include <algorithm>
#include <cstdlib>

namespace lapdlog {

namespace {

using capture::nanosecondsPerTick;

constexpr std::int64_t perSecond = 1'000'000'000;
constexpr std::int64_t ticksPerSecond = perSecond / nanosecondsPerTick;
constexpr std::int64_t ticksPerMinute = 60 * ticksPerSecond;
constexpr std::int64_t mostFall = 2;  // 8 ms: frames out of order

// How far host and board clock may differ between two frames of one trace, and over a wrap, in ticks.
constexpr std::int64_t closeBy = 10 * ticksPerSecond;
constexpr std::int64_t overAWrap = 3600 * ticksPerSecond;

}  // namespace

void BoardClock::Envelope::add(std::int64_t minute, std::int64_t difference) {
    Least& now = ofMinutes_[static_cast<std::size_t>(minute) % minutes];
    if (now.minute != minute)
        now = {minute, difference};
    now.difference = std::min(now.difference, difference);
    if (minute == minute_) {
        least_ = std::min(least_, difference);
        return;
    }
    minute_ = minute;
    least_ = difference;
    for (const Least& of : ofMinutes_) {
        if (of.minute >= 0 && of.minute > minute - static_cast<std::int64_t>(minutes))
            least_ = std::min(least_, of.difference);
    }
}

// The ticks since the last frame: forward, or a few backwards.
std::int64_t BoardClock::Track::since(std::uint32_t next) const {
    const auto last = static_cast<std::uint32_t>(ticks);
    if (next < last && last - next <= mostFall)
        return -static_cast<std::int64_t>(last - next);
    return static_cast<std::uint32_t>(next - last);
}

// How much further the board's clock went than the host's since the last frame, in ticks.
std::int64_t BoardClock::Track::lead(std::uint32_t next, std::int64_t nextHost) const {
    return since(next) - (nextHost - host) * ticksPerSecond;
}

bool BoardClock::Track::goesOn(std::uint32_t next, std::int64_t nextHost) const {
    const auto last = static_cast<std::uint32_t>(ticks);
    return next >= last || last - next <= mostFall || std::abs(lead(next, nextHost)) <= overAWrap;
}

void BoardClock::Track::take(std::uint32_t next, std::int64_t nextHost) {
    constexpr std::int64_t mostAbove = perSecond - nanosecondsPerTick;
    ticks = isUsed ? ticks + since(next) : next;
    host = nextHost;
    const std::int64_t difference = host * perSecond - ticks * nanosecondsPerTick;
    envelope.add(std::max<std::int64_t>(ticks, 0) / ticksPerMinute, difference);
    offset = isUsed ? std::clamp(offset, envelope.least(), envelope.least() + mostAbove) : difference;
    isUsed = true;
}

BoardClock::Verdict BoardClock::take(std::uint32_t ticks, std::int64_t host) {
    Verdict verdict = Verdict::goesOn;
    if (current_.isUsed && std::abs(current_.lead(ticks, host)) > closeBy) {
        if (other_.isUsed && std::abs(other_.lead(ticks, host)) <= closeBy) {
            std::swap(current_, other_);
            verdict = Verdict::otherTrace;
        } else {
            const bool falls = !current_.goesOn(ticks, host);
            // If the board's clock stays behind the host's, it has gone on, and the text was written late. If
            // it runs ahead, a new offset begins.
            other_ = current_;
            if (falls || current_.lead(ticks, host) > 0)
                current_ = {};
            verdict = falls ? Verdict::restarted : Verdict::goesOn;
        }
    }
    current_.take(ticks, host);
    return verdict;
}

std::optional<std::int64_t> BoardClock::expected(std::uint32_t ticks) const {
    if (!current_.isUsed)
        return std::nullopt;
    return (current_.offset + (current_.ticks + current_.since(ticks)) * nanosecondsPerTick) / perSecond;
}

}  // namespace lapdlog
