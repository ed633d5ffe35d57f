// The names of recordings, and the recordings that a folder has.
#ifndef RECORDING_RECORDINGS_H
#define RECORDING_RECORDINGS_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace recording {

// The trunk's name in a form that is safe in a path: letters, digits and "-_+@=." are kept, anything else
// becomes "_".
std::string fileNameOf(const std::string& trunk);

// The recordings of one trunk in one folder that have the names TRUNK.START.FORM, or TRUNK.START.MARK.FORM.
// START is a second in UTC, 20261121T112533Z. If several recordings begin in one second, a number follows:
// 20261121T112533Z.2.
struct RecordingKind {
    std::string folder;
    std::string trunk;  // as fileNameOf gives it
    std::string mark;   // may be empty
    std::string form;   // "pcapng"
};

// The ending of a recording that is being written.
inline constexpr std::string_view unfinishedEnding = ".part";

struct Recording {
    std::int64_t start = 0;  // seconds since 1970
    int number = 1;          // the number among the recordings of one second
    std::string name;        // without its folder, and without `unfinishedEnding`
};

// A path that no recording has yet, finished or not.
std::string newRecording(const RecordingKind& kind, std::int64_t start);

// The finished recordings, oldest first.
std::vector<Recording> finishedRecordings(const RecordingKind& kind);
std::vector<Recording> unfinishedRecordings(const RecordingKind& kind);

// Puts the recordings of each trunk among these paths in the order in which they began, in whatever folders
// they are: a shell lists the second recording of a second before the first. Other paths keep their places.
void putInOrder(std::vector<std::string>& paths);

}  // namespace recording

#endif
