// Counts many durations in little memory, and gives their number, mean, quantiles and longest.
#ifndef CALLS_DURATIONS_H
#define CALLS_DURATIONS_H

#include <cstdint>
#include <map>

namespace calls {

// Durations are counted in steps. A step is a millisecond long below 1.024 s, and above that less than a
// 512th of the duration. A quantile is the beginning of its step, so it is exact to the millisecond, or too
// short by less than 0.2 %. Count, mean and longest are exact. There are at most 20,000 steps.
class Durations {
  public:
    // Nanoseconds. A negative duration counts as 0.
    void add(std::int64_t nanoseconds);

    std::uint64_t count() const { return count_; }
    // Nanoseconds; 0 if nothing was added.
    std::int64_t longest() const { return longest_; }
    std::int64_t mean() const;
    // The shortest duration that at least this share (0 to 1) of all durations do not exceed. A share of 0.5
    // gives the median.
    std::int64_t quantile(double share) const;

  private:
    std::map<std::uint32_t, std::uint64_t> steps_;
    std::uint64_t count_ = 0;
    std::int64_t longest_ = 0;
    std::uint64_t milliseconds_ = 0;  // the sum of all durations
};

}  // namespace calls

#endif
