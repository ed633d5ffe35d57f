#include "calls/ChannelClock.h"

#include <algorithm>
#include <limits>

namespace calls {

namespace {

constexpr std::int64_t ticksOutOfOrder =
    2;  // 8 ms, because the recorder may give frames of the two directions in the wrong order

// The clock stops here, ten years before its numbers end, so that timers can be added to any of its readings.
// No real trace comes near it; the times in a damaged capture may.
constexpr std::int64_t latest =
    std::numeric_limits<std::int64_t>::max() - std::int64_t{10} * 366 * 86400 * 1'000'000'000;

// The time from one moment to a later one, at most the longest time that the number can hold.
std::int64_t timeBetween(std::int64_t from, std::int64_t to) {
    std::int64_t passed = 0;
    return __builtin_sub_overflow(to, from, &passed) ? std::numeric_limits<std::int64_t>::max() : passed;
}

}  // namespace

void ChannelClock::pass(std::int64_t nanoseconds) {
    now_ = now_ > latest - std::min(nanoseconds, latest) ? latest : now_ + nanoseconds;
}

std::int64_t ChannelClock::at(const capture::Frame& frame) {
    restarted_ = false;
    since_ = 0;
    const bool hasClock = frame.clock != capture::Clock::none;
    hasTime_ = hasTime_ || hasClock || frame.ticks.has_value();
    const std::int64_t passed =
        hasClock && begun_ && frame.time > lastTime_ ? timeBetween(lastTime_, frame.time) : 0;
    if (!begun_ && hasClock)
        now_ = std::min(frame.time, latest);
    begun_ = begun_ || hasClock;
    if (hasClock)
        lastTime_ = frame.time;
    if (!frame.ticks) {
        pass(passed);
        return now_;
    }
    // The difference modulo 2^32, so that a wrap of the ticks is a small step forward.
    const auto step = static_cast<std::int32_t>(*frame.ticks - lastTicks_);
    if (!hasTicks_) {
        pass(passed);
    } else if (step >= 0) {
        pass(step * capture::nanosecondsPerTick);
    } else if (-std::int64_t{step} > ticksOutOfOrder) {
        restarted_ = true;
        pass(passed);
    }
    if (!hasTicks_ || step > 0 || restarted_)
        lastTicks_ = *frame.ticks;
    hasTicks_ = true;
    return now_;
}

}  // namespace calls
