// Reads a log as it comes and checks it frame by frame against what the board played.
#ifndef BENCH_ROAD_LOG_WATCH_H
#define BENCH_ROAD_LOG_WATCH_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "softboard/scenario.h"

namespace bench {

// The frames of a capture that is played again and again, as the log shows them.
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
    std::uint64_t frames = 0;      // whole in the log
    std::uint64_t lost = 0;        // played before one that is there, and not there
    std::uint64_t outOfOrder = 0;  // or not as they were played
    std::uint64_t refused = 0;     // by the program's queue
};

class LogWatch {
  public:
    explicit LogWatch(const Played& played) : played_(played) {}

    // The next piece of the log. Returns how many header lines it ended.
    std::uint64_t take(std::string_view piece);
    // No more comes: a frame that was begun is whole.
    void end() { endFrame(); }

    const Checked& checked() const { return checked_; }

  private:
    void takeLine(std::string_view line);
    void endFrame();

    const Played& played_;
    Checked checked_;
    std::uint64_t headers_ = 0;
    std::uint64_t next_ = 0;  // of those played
    std::string rest_;        // a line that was begun
    std::string header_;      // of the frame that was begun; empty: none was
    std::string dump_;
    bool inDump_ = false;
};

}  // namespace bench

#endif
