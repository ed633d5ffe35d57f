// Records one D channel: its files, the numbers of its frames, and what surrounds triggers.
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

// Numbers the frames of each log. If the recorder is started again with a log that it knows, it skips the
// frames that are recorded already and goes on. Each file holds frames of one run.
class RecordedTrunk {
  public:
    // Finishes files that a recorder that was killed has left. Keeps references to its arguments.
    RecordedTrunk(const RecordRules& rules, const std::string& trunk, Chatter& chatter);
    RecordedTrunk(const RecordedTrunk&) = delete;
    RecordedTrunk& operator=(const RecordedTrunk&) = delete;

    void take(const capture::Item& item);
    // The log of this trunk was emptied or replaced, as `item` says. The next frame is the first of another
    // log.
    void logIsGone(const capture::Item& item);
    // Whether the last item was recorded before this recorder was started.
    bool isBehind() const { return isBehind_; }
    void trigger(const std::string& why);

    void flush();
    // Nothing has come since the last flush, and the host's clock shows `second` (since 1970).
    void idle(std::int64_t second);
    // Makes the next item begin a new file.
    void beginFile();
    void finish();

    // Whether the last item came from this file.
    bool readsFrom(std::string_view file) const { return source_ == file; }
    // How many frames could not be written, and how many of these the user has not been told of.
    std::uint64_t lostInAll() const { return file_.lostInAll(); }
    std::uint64_t lostUnsaid() const { return file_.lostUnsaid(); }

    // The state is written at once when its list of files or its log changes. Changes of its numbers alone,
    // which each frame makes, are written once in this time: a second, unless a test sets another.
    void writeStateEvery(std::chrono::steady_clock::duration time) { betweenStates_ = time; }
    // As RotatingFile has it.
    void retryEvery(RotatingFile::HostClock::duration time) { file_.retryEvery(time); }

  private:
    void adoptUnfinished();
    void continueBehind(const recording::RecordedFile& file, const std::string& path);
    void continueBehindFinished();
    void meet(const capture::Item& first);
    void place(const capture::Item& item);
    bool isRecorded(bool isNumbered) const;
    void record(const capture::Item& item, bool isNumbered);
    void enlist();
    void unlist();
    void saveState();

    const RecordRules& rules_;
    std::string trunk_;  // the trunk's name as it is written in file names
    Chatter& chatter_;
    std::string statePath_;
    recording::RecordState state_;
    RotatingFile file_;
    Surroundings surroundings_;

    // Describe the log that is read now.
    bool isMet_ = false;              // its first frame has come, so the run is known
    std::string source_;              // the log's name; empty before anything has come
    capture::Batch waiting_;          // items that came before its first frame
    std::uint64_t frames_ = 0;        // how many of its frames have come
    std::uint64_t besides_ = 0;       // items after the last frame that are no frames
    std::uint64_t recordedNext_ = 1;  // the first frame that was not recorded by a recorder before this one
    std::uint64_t recordedBesides_ = 0;
    bool isBehind_ = false;

    std::uint64_t enlisted_ = 0;  // how many files of `file_` are listed in the state
    bool isChanged_ = false;      // the state in memory differs from the file
    bool isListed_ = true;        // the file is right except for numbers that change with each frame
    bool stateFails_ = false;     // the user was told that the state cannot be written
    std::chrono::steady_clock::time_point nextState_;
    std::chrono::steady_clock::duration betweenStates_ = std::chrono::seconds(1);
};

}  // namespace reader

#endif
