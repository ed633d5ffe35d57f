#include "calls/UseOverTime.h"

#include <algorithm>
#include <array>

namespace calls {

namespace {

constexpr std::int64_t minute = 60 * second;
constexpr std::int64_t hour = 60 * minute;
constexpr std::int64_t day = 24 * hour;
// The widths of steps. Each is a multiple of the one before, so that steps can be put together.
constexpr std::array widths{second,      5 * second, 15 * second, minute, 5 * minute,
                            15 * minute, hour,       6 * hour,    day};

std::int64_t widerThan(std::int64_t width) {
    const auto* const next = std::upper_bound(widths.begin(), widths.end(), width);
    return next == widths.end() ? 2 * width : *next;
}

}  // namespace

void UseOverTime::set(const Moment& moment, unsigned inUse) {
    if (moment.clock == capture::Clock::none)
        return;
    if (moment.clock == clock_ && inUse_ > 0)
        count(clock_, since_, std::max(since_, moment.time));
    clock_ = moment.clock;
    since_ = moment.time;
    inUse_ = inUse;
    // A use that begins and ends at one moment still counts in the greatest number at once.
    count(clock_, since_, since_);
}

std::int64_t UseOverTime::stepOf(std::int64_t time) const {
    return time >= 0 ? time / width_ : (time + 1) / width_ - 1;
}

void UseOverTime::count(capture::Clock clock, std::int64_t from, std::int64_t until) {
    if (inUse_ == 0)
        return;
    while (wouldBeTooMany(clock, from, until))
        widen();
    std::int64_t at = from;
    do {
        // The end of the last step may be no time any more, so it is not computed.
        const std::int64_t left = width_ - (at % width_ + width_) % width_;
        const std::int64_t next = until - at <= left ? until : at + left;
        Step& step = steps_[{clock, stepOf(at)}];
        step.used += (next - at) * inUse_;
        step.most = std::max(step.most, inUse_);
        at = next;
    } while (at < until);
}

bool UseOverTime::wouldBeTooMany(capture::Clock clock, std::int64_t from, std::int64_t until) const {
    std::int64_t first = stepOf(from);
    std::int64_t last = stepOf(until);
    const auto begin = steps_.lower_bound({clock, INT64_MIN});
    const auto end = steps_.upper_bound({clock, INT64_MAX});
    if (begin != end) {
        first = std::min(first, begin->first.step);
        last = std::max(last, std::prev(end)->first.step);
    }
    return last - first >= mostSteps;
}

void UseOverTime::widen() {
    const std::int64_t before = width_;
    width_ = widerThan(before);
    std::map<Key, Step> wider;
    for (const auto& [key, step] : steps_) {
        Step& whole = wider[{key.clock, stepOf(key.step * before)}];
        whole.used += step.used;
        whole.most = std::max(whole.most, step.most);
    }
    steps_ = std::move(wider);
}

}  // namespace calls
