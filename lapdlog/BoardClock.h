// Computes when a frame passed. It combines the board's ticks, which are exact but begin anywhere and drift,
// and the second in which the frame was written to the log, which is at most a second early but may be very
// late.
#ifndef LAPDLOG_BOARD_CLOCK_H
#define LAPDLOG_BOARD_CLOCK_H

#include <array>
#include <cstdint>
#include <optional>

#include "capture/Frame.h"

namespace lapdlog {

// A time is ticks plus an offset. The lower envelope, which is the least difference of host and ticks in the
// hour before the frame (by minutes of the board's clock), bounds the offset: it lies between the envelope
// and a second above, since the host's time is told in whole seconds. Within these bounds the offset stays as
// it is. So absolute times are good to a second, and differences to 4 ms.
//
// Ticks wrap at 2^32. Ticks that fall by more than 8 ms, other than by a wrap that the host's time agrees
// with, are a restart. Ticks that leap and return as the host's time has it are those of two traces in one
// file.
class BoardClock {
  public:
    enum class Verdict : std::uint8_t { goesOn, restarted, otherTrace };

    // Takes the ticks of the next frame and the host's second in which it was written.
    Verdict take(std::uint32_t ticks, std::int64_t host);
    // The time of the frame taken last, in nanoseconds since 1970.
    std::int64_t time() const { return current_.offset + current_.ticks * capture::nanosecondsPerTick; }
    // The host's second that belongs to these ticks if the board's clock has gone on without a restart.
    std::optional<std::int64_t> expected(std::uint32_t ticks) const;
    // A new run begins.
    void reset() { *this = {}; }

  private:
    // The least difference of host and ticks, in nanoseconds, in the last 60 minutes.
    class Envelope {
      public:
        void add(std::int64_t minute, std::int64_t difference);
        std::int64_t least() const { return least_; }

      private:
        static constexpr std::size_t minutes = 60;
        struct Least {
            std::int64_t minute = -1;
            std::int64_t difference = 0;
        };
        std::array<Least, minutes> ofMinutes_{};
        std::int64_t minute_ = -1;
        std::int64_t least_ = 0;
    };

    // One board's clock since it started.
    struct Track {
        bool isUsed = false;
        std::int64_t ticks = 0;  // without wraps
        std::int64_t host = 0;
        std::int64_t offset = 0;  // nanoseconds
        Envelope envelope;

        std::int64_t since(std::uint32_t next) const;
        bool goesOn(std::uint32_t next, std::int64_t nextHost) const;
        std::int64_t lead(std::uint32_t next, std::int64_t nextHost) const;
        void take(std::uint32_t next, std::int64_t nextHost);
    };

    Track current_;
    Track other_;  // where the clock stood before it leapt
};

}  // namespace lapdlog

#endif
