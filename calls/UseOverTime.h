// Counts how many channels were in use over time, in steps whose width grows with the trace.
#ifndef CALLS_USEOVERTIME_H
#define CALLS_USEOVERTIME_H

#include <compare>
#include <cstddef>
#include <cstdint>
#include <map>

#include "calls/Call.h"

namespace calls {

// Takes each change of the number of channels in use. Memory is bounded: when there would be too many steps,
// the width grows and steps are joined. Steps begin at multiples of their width, so the steps of several
// objects can be compared.
class UseOverTime {
  public:
    // The largest number of steps on one clock, including empty ones.
    static constexpr std::int64_t mostSteps = 400;

    // Identifies a step: its clock, and the time divided by the width.
    struct Key {
        capture::Clock clock = capture::Clock::none;
        std::int64_t step = 0;
        auto operator<=>(const Key&) const = default;
    };
    struct Step {
        std::int64_t used = 0;  // nanoseconds, of all channels together
        unsigned most = 0;      // the largest number of channels in use at the same time
    };

    // From this moment on, `inUse` channels are in use. A moment without a time is ignored. An earlier moment
    // than the one before takes nothing back.
    void set(const Moment& moment, unsigned inUse);

    // The width of a step in nanoseconds: 1, 5, 15 s, 1, 5, 15 min, 1, 6 h, 1 day, and then twice the last
    // one each time.
    std::int64_t width() const { return width_; }
    // The steps in which a channel was in use.
    const std::map<Key, Step>& steps() const { return steps_; }

  private:
    std::int64_t stepOf(std::int64_t time) const;
    void count(capture::Clock clock, std::int64_t from, std::int64_t until);
    bool wouldBeTooMany(capture::Clock clock, std::int64_t from, std::int64_t until) const;
    void widen();

    std::int64_t width_ = second;
    std::map<Key, Step> steps_;
    capture::Clock clock_ = capture::Clock::none;  // of the last change
    std::int64_t since_ = 0;                       // its time
    unsigned inUse_ = 0;
};

}  // namespace calls

#endif
