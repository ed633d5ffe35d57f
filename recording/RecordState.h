// What a recorder has to know about a trunk when it is started anew: a small file beside the recordings.
#ifndef RECORDING_RECORDSTATE_H
#define RECORDING_RECORDSTATE_H

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "capture/Frame.h"

namespace recording {

// A log and the run of frames that it holds, so that the same run is known again. The path is for people.
struct RecordedLog {
    std::string path;
    std::uint64_t device = 0;
    std::uint64_t inode = 0;
    // Of its first frame of this trunk: nanoseconds as the frame's clock counts, board ticks, octets as hex.
    std::int64_t time = 0;
    std::optional<std::uint32_t> ticks;
    std::string hex;

    bool holdsTheSameAs(const RecordedLog& other) const {
        return device == other.device && inode == other.inode && time == other.time && ticks == other.ticks &&
               hex == other.hex;
    }
};

// Nothing if the frame was read from what is no regular file, and so cannot be read a second time.
std::optional<RecordedLog> logOf(const capture::Frame& first);

// The frames of one recording are numbered without gaps: those of no other run are in it.
struct RecordedFile {
    std::string name;  // the finished one
    std::uint64_t run = 0;
    std::uint64_t first = 0;  // number of its first frame
};

// docs/user/recorder-state.md describes the file. Frames of a run are counted from 1; frames too long for a
// log count as well, what is no frame does not.
struct RecordState {
    static constexpr std::size_t mostFiles = 1000;

    std::string trunk;
    std::uint64_t run = 0;            // microseconds since 1970 when its log was met; 0: none yet
    std::uint64_t next = 1;           // the number that its next frame gets
    std::uint64_t besides = 0;        // recorded items behind the frame before that, which are no frames
    std::optional<RecordedLog> log;   // that the run is read from
    std::vector<RecordedFile> files;  // the newest ones, oldest first
};

std::string statePath(const std::string& folder, const std::string& trunk);

// Nothing if there is no such file. Throws std::runtime_error, which names the file, if it is damaged.
std::optional<RecordState> readState(const std::string& path);

// Puts it in the place of the old one in one step (rename). Returns what is wrong, or nothing.
std::optional<std::string> writeState(const RecordState& state, const std::string& path);

// Makes a new run, numbered behind all that were before.
void beginRun(RecordState& state, std::optional<RecordedLog> log);

}  // namespace recording

#endif
