#include "calls/Durations.h"

#include <algorithm>
#include <bit>
#include <cmath>

#include "calls/Message.h"

namespace calls {

namespace {

// Each value below `exact` is a step of its own. Above it, each doubling of the value has half as many steps.
constexpr unsigned bits = 10;
constexpr std::uint64_t exact = std::uint64_t{1} << bits;

std::uint32_t stepOf(std::uint64_t milliseconds) {
    if (milliseconds < exact)
        return static_cast<std::uint32_t>(milliseconds);
    const unsigned shift = static_cast<unsigned>(std::bit_width(milliseconds)) - bits;
    return static_cast<std::uint32_t>(shift * (exact / 2) + (milliseconds >> shift));
}

std::uint64_t beginOf(std::uint32_t step) {
    if (step < exact)
        return step;
    const std::uint64_t shift = step / (exact / 2) - 1;
    return (step - shift * (exact / 2)) << shift;
}

}  // namespace

void Durations::add(std::int64_t nanoseconds) {
    const std::int64_t duration = std::max<std::int64_t>(nanoseconds, 0);
    ++steps_[stepOf(static_cast<std::uint64_t>(duration / millisecond))];
    ++count_;
    milliseconds_ += static_cast<std::uint64_t>(duration / millisecond);
    longest_ = std::max(longest_, duration);
}

std::int64_t Durations::mean() const {
    return count_ == 0 ? 0 : static_cast<std::int64_t>(milliseconds_ / count_) * millisecond;
}

std::int64_t Durations::quantile(double share) const {
    const auto wanted = std::max<std::uint64_t>(
        1, static_cast<std::uint64_t>(std::ceil(share * static_cast<double>(count_))));
    if (wanted >= count_)
        return longest_;
    std::uint64_t seen = 0;
    for (const auto& [step, times] : steps_) {
        seen += times;
        if (seen >= wanted)
            return static_cast<std::int64_t>(beginOf(step)) * millisecond;
    }
    return longest_;
}

}  // namespace calls
