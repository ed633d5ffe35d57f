// Many durations in little memory: how many, the middle one, the one that few exceed, the longest.
#ifndef CALLS_DURATIONS_H
#define CALLS_DURATIONS_H

#include <cstdint>
#include <map>

namespace calls {

// Counts durations in steps: of a millisecond below 1.024 s, and above of less than a 512th of the duration.
// A quantile is the beginning of its step, so it is exact to the millisecond, or too short by less than 0.2
// %. Count, mean and longest are exact. At most 20,000 steps exist, however many durations there are.
class Durations {
  public:
    // Nanoseconds. A negative duration counts as 0.
    void add(std::int64_t nanoseconds);

    std::uint64_t count() const { return count_; }
    // Nanoseconds; 0 while there is none.
    std::int64_t longest() const { return longest_; }
    std::int64_t mean() const;
    // The shortest duration that at least this share (0 to 1) of all do not exceed: 0.5 is the median.
    std::int64_t quantile(double share) const;

  private:
    std::map<std::uint32_t, std::uint64_t> steps_;
    std::uint64_t count_ = 0;
    std::int64_t longest_ = 0;
    std::uint64_t milliseconds_ = 0;  // of all together
};

}  // namespace calls

#endif
