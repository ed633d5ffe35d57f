// One D channel as it is recorded: its files, its numbers, and what surrounds a trigger.
#ifndef READER_RECORDEDTRUNK_H
#define READER_RECORDEDTRUNK_H

#include <chrono>
#include <cstdint>
#include <string>

#include "capture/Batch.h"
#include "capture/Item.h"
#include "reader/Chatter.h"
#include "reader/RotatingFile.h"
#include "reader/Surroundings.h"
#include "recording/RecordState.h"

namespace reader {

struct RecordRules {
    RotationRules files;
    SurroundingsRules surroundings;
};

// Numbers the frames of each log it meets. Started anew with the log that it knows, it passes over what is
// recorded already and goes on. Each file holds frames of one run.
class RecordedTrunk {
  public:
    // Finishes what a recorder that was killed has left. References are kept.
    RecordedTrunk(const RecordRules& rules, const std::string& trunk, Chatter& chatter);
    RecordedTrunk(const RecordedTrunk&) = delete;
    RecordedTrunk& operator=(const RecordedTrunk&) = delete;

    void take(const capture::Item& item);
    // The log that this trunk was read from was emptied or replaced: the next frame is the first of another.
    // `item` says so.
    void logIsGone(const capture::Item& item);
    // Whether the last item was recorded before this recorder was started.
    bool isBehind() const { return isBehind_; }
    void trigger(const std::string& why);

    void flush();
    // Nothing has come since the last flush, and the host's clock says `second` (since 1970).
    void idle(std::int64_t second);
    // The next item begins a new file.
    void beginFile();
    void finish();

    bool readsFrom(std::string_view file) const { return source_ == file; }
    std::uint64_t lostInAll() const { return file_.lostInAll(); }

    // How often a state that changes all the time is written; a second, unless a test wants it otherwise.
    void writeStateEvery(std::chrono::steady_clock::duration time) { betweenStates_ = time; }

  private:
    void adoptUnfinished();
    void continueBehind(const recording::RecordedFile& file, const std::string& path);
    void meet(const capture::Item& first);
    void place(const capture::Item& item);
    bool isRecorded(bool isNumbered) const;
    void record(const capture::Item& item, bool isNumbered);
    void enlist();
    void saveState();

    const RecordRules& rules_;
    std::string trunk_;  // as it stands in file names
    Chatter& chatter_;
    std::string statePath_;
    recording::RecordState state_;
    RotatingFile file_;
    Surroundings surroundings_;

    // Of the log that is read now.
    bool isMet_ = false;              // its first frame has come
    std::string source_;              // its name; empty before anything has come
    capture::Batch waiting_;          // what came before its first frame
    std::uint64_t frames_ = 0;        // that have come
    std::uint64_t besides_ = 0;       // items behind the last of them that are no frames
    std::uint64_t recordedNext_ = 1;  // the first frame that was not recorded by a recorder before this one
    std::uint64_t recordedBesides_ = 0;
    bool isBehind_ = false;

    std::uint64_t enlisted_ = 0;  // files of `file_` that are in the state
    bool isChanged_ = false;      // the state is not what is written down
    bool isListed_ = true;        // ... but for numbers that change with each frame
    bool stateFails_ = false;     // it was said that it cannot be written
    std::chrono::steady_clock::time_point nextState_;
    std::chrono::steady_clock::duration betweenStates_ = std::chrono::seconds(1);
};

}  // namespace reader

#endif
