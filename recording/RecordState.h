// The small file beside the recordings from which a recorder that is started again learns how far it had come
// on a trunk.
#ifndef RECORDING_RECORDSTATE_H
#define RECORDING_RECORDSTATE_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "capture/Frame.h"

namespace recording {

// Identifies a log and the run of frames in it, so that the run can be recognised later. The path is only for
// messages.
struct RecordedLog {
    std::string path;
    std::uint64_t device = 0;
    std::uint64_t inode = 0;
    // The first frame of this trunk in the log: its time in nanoseconds on the frame's clock, its board
    // ticks, and its octets in hexadecimal.
    std::int64_t time = 0;
    std::optional<std::uint32_t> ticks;
    std::string hex;

    bool holdsTheSameAs(const RecordedLog& other) const {
        return device == other.device && inode == other.inode && time == other.time && ticks == other.ticks &&
               hex == other.hex;
    }
};

// Describes the log that a frame was read from. Returns nothing if that is no regular file, because it could
// not be read a second time.
std::optional<RecordedLog> logOf(const capture::Frame& first);

// One line of JSON, as it stands in the state. Reading throws std::runtime_error for anything else.
std::string toJson(const RecordedLog& log);
RecordedLog logFromJson(std::string_view text);

// A recording that was finished. It holds frames of one run only, numbered without gaps.
struct RecordedFile {
    std::string name;  // the file's name once it is finished
    std::uint64_t run = 0;
    std::uint64_t first = 0;  // number of its first frame within the run
};

// docs/user/recorder-state.md describes the file. The frames of a run are numbered from 1. Frames that are
// too long for a log count as well; items that are no frames do not.
struct RecordState {
    static constexpr std::size_t mostFiles = 1000;

    std::string trunk;
    // identifies the run: microseconds since 1970 when its log was first seen; 0: none yet
    std::uint64_t run = 0;
    std::uint64_t next = 1;           // the number of the run's next frame
    std::uint64_t besides = 0;        // how many items that are no frames were recorded after the last frame
    std::optional<RecordedLog> log;   // the log that the run is read from
    std::vector<RecordedFile> files;  // the newest ones, oldest first
};

std::string statePath(const std::string& folder, const std::string& trunk);

// Returns nothing if the file does not exist. Throws std::runtime_error, which names the file, if it is
// damaged.
std::optional<RecordState> readState(const std::string& path);

// Replaces the file in one step (rename). Returns words that say what went wrong, or nothing.
std::optional<std::string> writeState(const RecordState& state, const std::string& path);

// Begins a new run, whose number is higher than those of all runs before.
void beginRun(RecordState& state, std::optional<RecordedLog> log);

}  // namespace recording

#endif
