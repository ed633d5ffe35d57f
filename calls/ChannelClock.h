// The clock of one D channel, by which durations are measured.
#ifndef CALLS_CHANNELCLOCK_H
#define CALLS_CHANNELCLOCK_H

#include <cstdint>

#include "capture/Frame.h"

namespace calls {

// Goes by the board's ticks where frames have them, else by their times; it never goes back. It begins at the
// first frame's time, so that the clocks of several D channels can be compared as well as their hosts' can.
class ChannelClock {
  public:
    // Nanoseconds at this frame.
    std::int64_t at(const capture::Frame& frame);
    // The last frame's ticks fell by more than 8 ms, other than by going round: the board was restarted, or
    // another trace begins.
    bool hasRestarted() const { return restarted_; }
    // Of the last frame, and what has passed since.
    std::int64_t now() const { return now_ + since_; }
    // No frame has come, but time has passed (a trace that is followed). The next frame tells exactly how
    // much, so that durations are those of the frames' clocks alone.
    void advance(std::int64_t nanoseconds) { since_ += nanoseconds; }
    // Whether frames have times at all; without them nothing can be said about timers.
    bool hasTime() const { return hasTime_; }

  private:
    std::int64_t now_ = 0;    // at the last frame
    std::int64_t since_ = 0;  // of another clock, since then
    std::int64_t lastTime_ = 0;
    std::uint32_t lastTicks_ = 0;
    bool begun_ = false;
    bool hasTicks_ = false;
    bool hasTime_ = false;
    bool restarted_ = false;
};

}  // namespace calls

#endif
