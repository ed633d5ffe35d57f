// The files that recordings are kept in: their names, and which of them are there.
#ifndef RECORDING_RECORDINGS_H
#define RECORDING_RECORDINGS_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace recording {

// A name that is safe in a path: letters, digits and "-_+@=." stay, anything else becomes "_".
std::string fileNameOf(const std::string& trunk);

// Which recordings of a folder are meant: TRUNK.START.FORM, or TRUNK.START.MARK.FORM. START is a second in
// UTC, 20261121T112533Z, and has a number behind it if that second has several: 20261121T112533Z.2.
struct RecordingKind {
    std::string folder;
    std::string trunk;  // as fileNameOf gives it
    std::string mark;   // may be empty
    std::string form;   // "pcapng"
};

// A recording that is being written has this behind its name.
inline constexpr std::string_view unfinishedEnding = ".part";

struct Recording {
    std::int64_t start = 0;  // seconds since 1970
    int number = 1;          // among those of one second
    std::string name;        // without folder, and without `unfinishedEnding`
};

// A name that no file has yet, finished or not, with its folder.
std::string newRecording(const RecordingKind& kind, std::int64_t start);

// Oldest first.
std::vector<Recording> finishedRecordings(const RecordingKind& kind);
std::vector<Recording> unfinishedRecordings(const RecordingKind& kind);

}  // namespace recording

#endif
