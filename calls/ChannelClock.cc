#include "calls/ChannelClock.h"

#include <algorithm>

namespace calls {

namespace {

constexpr std::int64_t ticksOutOfOrder =
    2;  // 8 ms, because the recorder may give frames of the two directions in the wrong order

}  // namespace

std::int64_t ChannelClock::at(const capture::Frame& frame) {
    restarted_ = false;
    since_ = 0;
    const bool hasClock = frame.clock != capture::Clock::none;
    hasTime_ = hasTime_ || hasClock || frame.ticks.has_value();
    const std::int64_t passed = hasClock && begun_ ? std::max<std::int64_t>(frame.time - lastTime_, 0) : 0;
    if (!begun_ && hasClock)
        now_ = frame.time;
    begun_ = begun_ || hasClock;
    if (hasClock)
        lastTime_ = frame.time;
    if (!frame.ticks) {
        now_ += passed;
        return now_;
    }
    // The difference modulo 2^32, so that a wrap of the ticks is a small step forward.
    const auto step = static_cast<std::int32_t>(*frame.ticks - lastTicks_);
    if (!hasTicks_) {
        now_ += passed;
    } else if (step >= 0) {
        now_ += step * capture::nanosecondsPerTick;
    } else if (-std::int64_t{step} > ticksOutOfOrder) {
        restarted_ = true;
        now_ += passed;
    }
    if (!hasTicks_ || step > 0 || restarted_)
        lastTicks_ = *frame.ticks;
    hasTicks_ = true;
    return now_;
}

}  // namespace calls
