// Reads a log while it is written and compares it, frame by frame, with what the board played.
#ifndef BENCH_ROAD_LOG_WATCH_H
#define BENCH_ROAD_LOG_WATCH_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "softboard/scenario.h"

namespace bench {

// The frames of a capture that is played again and again, as the log shows them. Frame i is counted through
// all rounds.
class Played {
  public:
    explicit Played(const softboard::Frames& frames);

    std::string header(std::uint64_t i) const;  // "TX Frame: Time = 12.4"
    const std::string& dump(std::uint64_t i) const { return dumps_[i % dumps_.size()]; }

  private:
    const softboard::Frames& frames_;
    std::vector<std::string> dumps_;  // "00 01 7f "
};

struct Checked {
    std::uint64_t frames = 0;      // complete in the log
    std::uint64_t lost = 0;        // missing, although a frame that was played later is in the log
    std::uint64_t outOfOrder = 0;  // in the wrong place, or different from what was played
    std::uint64_t refused = 0;     // lines "Enqueue Failed"
};

class LogWatch {
  public:
    explicit LogWatch(const Played& played) : played_(played) {}

    // Takes the next piece of the log, which may begin and end anywhere. Returns how many header lines ("RX
    // Frame ...") have been completed by it.
    std::uint64_t take(std::string_view piece);
    // Call it at the end of the log: the last frame is then complete.
    void end() { endFrame(); }

    const Checked& checked() const { return checked_; }

  private:
    void takeLine(std::string_view line);
    void endFrame();

    const Played& played_;
    Checked checked_;
    std::uint64_t headers_ = 0;
    std::uint64_t next_ = 0;  // the number of the frame that is expected next
    std::string rest_;        // the beginning of a line that is not complete yet
    std::string header_;      // the header line of the frame that is being read; empty: no frame
    std::string dump_;        // the dump of that frame, as far as it has come
    bool inDump_ = false;
};

}  // namespace bench

#endif
