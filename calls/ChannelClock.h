// The clock of one D channel, by which durations are measured.
#ifndef CALLS_CHANNELCLOCK_H
#define CALLS_CHANNELCLOCK_H

#include <cstdint>

#include "capture/Frame.h"

namespace calls {

// Counts the board's ticks where the frames have them, and the frames' times otherwise. It never goes back.
// It starts at the time of the first frame, so the clocks of several D channels agree with each other as well
// as the clocks of their hosts do.
class ChannelClock {
  public:
    // Moves the clock on to this frame and returns its reading, in nanoseconds.
    std::int64_t at(const capture::Frame& frame);
    // Whether the ticks of the last frame were more than 8 ms lower than those before, and had not just
    // wrapped at 2^32. Then the board was restarted, or another trace begins here.
    bool hasRestarted() const { return restarted_; }
    // The reading at the last frame, plus the time that advance() has added since.
    std::int64_t now() const { return now_ + since_; }
    // Says that time has passed without a frame, in a trace that is followed. The next frame replaces this
    // estimate by its own time, so that durations depend on the frames' clocks only.
    void advance(std::int64_t nanoseconds) { since_ += nanoseconds; }
    // Whether any frame has had ticks or a time. Without them nothing can be said about timers.
    bool hasTime() const { return hasTime_; }

  private:
    void pass(std::int64_t nanoseconds);  // not negative

    std::int64_t now_ = 0;    // at the last frame
    std::int64_t since_ = 0;  // added by advance() since the last frame
    std::int64_t lastTime_ = 0;
    std::uint32_t lastTicks_ = 0;
    bool begun_ = false;
    bool hasTicks_ = false;
    bool hasTime_ = false;
    bool restarted_ = false;
};

}  // namespace calls

#endif
