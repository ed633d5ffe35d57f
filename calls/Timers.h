// The timers of Q.921 and Q.931 that decide when an answer is late. The user can change each, because
// networks differ.
#ifndef CALLS_TIMERS_H
#define CALLS_TIMERS_H

#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>

#include "calls/Message.h"

namespace calls {

// Values are in nanoseconds. The defaults are those of Q.931 tables 9-1 and 9-2 and Q.921 5.9. Where these
// give several values, the default is the one that raises fewer alarms.
struct Timers {
    // Layer 2
    std::int64_t t200 = 1 * second;
    std::int64_t t201 = 1 * second;
    std::int64_t t203 = 10 * second;  // without a frame; then a side polls
    // Set-up
    std::int64_t t301 = 180 * second;  // alerting, at least
    std::int64_t t302 = 15 * second;   // between digits, network
    std::int64_t t303 = 4 * second;
    std::int64_t t304Network = 20 * second;
    std::int64_t t304User = 30 * second;
    std::int64_t t310Network = 10 * second;
    std::int64_t t310User = 120 * second;
    std::int64_t t312 = 6 * second;  // T303 and 2 s
    std::int64_t t313 = 4 * second;
    // Clearing
    std::int64_t t305 = 30 * second;
    std::int64_t t306 = 30 * second;
    std::int64_t t308 = 4 * second;
    std::int64_t t309 = 90 * second;
    // The rest
    std::int64_t t307 = 180 * second;
    std::int64_t t314 = 4 * second;
    std::int64_t t316 = 120 * second;
    std::int64_t t318 = 4 * second;
    std::int64_t t319 = 4 * second;
    std::int64_t t322 = 4 * second;
    // Added to each timer, because the board's clock is exact only to a tick of 4 ms at both ends.
    std::int64_t slack = 8 * millisecond;
};

struct TimerName {
    std::string_view name;  // "T305", "T304-user"
    std::int64_t Timers::*value;
    std::string_view clause;
};
std::span<const TimerName> timerNames();

// Thrown for a timer that does not exist and for a value that is no duration. what() says which word is
// wrong.
class BadTimer : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// Sets a timer as `setting` says: "T305=4s", "T316=500ms", "T307=3min". A number without a unit is seconds.
// Case does not matter. "T304" sets the timers of both sides. Throws BadTimer.
void setTimer(Timers& timers, std::string_view setting);

}  // namespace calls

#endif
