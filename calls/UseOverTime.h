// How many channels were in use as time went by, in steps that grow with the trace.
#ifndef CALLS_USEOVERTIME_H
#define CALLS_USEOVERTIME_H

#include <compare>
#include <cstddef>
#include <cstdint>
#include <map>

#include "calls/Call.h"

namespace calls {

// Is told of each change of the number of channels in use. Memory is bounded: when the steps would be too
// many, they become longer, and steps that were counted are put together. Steps begin at whole multiples of
// their width, so those of several objects can be compared.
class UseOverTime {
  public:
    // On one clock there are at most so many steps, empty ones among them.
    static constexpr std::int64_t mostSteps = 400;

    // Which step: time divided by the width.
    struct Key {
        capture::Clock clock = capture::Clock::none;
        std::int64_t step = 0;
        auto operator<=>(const Key&) const = default;
    };
    struct Step {
        std::int64_t used = 0;  // nanoseconds, of all channels together
        unsigned most = 0;      // channels in use at once
    };

    // From now on so many are in use. A moment that no clock has told is passed over; one that is earlier
    // than the moment before takes nothing back.
    void set(const Moment& moment, unsigned inUse);

    // Of a step, in nanoseconds: 1, 5, 15 s, 1, 5, 15 min, 1, 6 h, 1 day, and from there on the double.
    std::int64_t width() const { return width_; }
    // Those in which a channel was in use.
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
