// Writes files as a whole.
#ifndef RECORDING_FILES_H
#define RECORDING_FILES_H

#include <optional>
#include <string>
#include <string_view>

namespace recording {

// Writes all of the text, even if the system writes less at a time or is interrupted. Returns 0 or the
// error's number.
int writeAll(int descriptor, std::string_view text);

// Gives back the room on the disk that was reserved behind the end of the file. If that fails, it returns
// false, and the room stays reserved as long as the file is there.
bool giveRoomBack(int descriptor);

// replaceFile writes the text to PATH.new and renames that file to PATH, so that a reader sees either the old
// text or the new one. It returns words that say what went wrong, or nothing. When it returns:
enum class Durability {
    whenever,  // the system has it; a power failure may bring the old text back, or leave an empty file
    onDisk     // the disk has it
};
std::optional<std::string> replaceFile(const std::string& path, std::string_view text,
                                       Durability durability = Durability::whenever);

}  // namespace recording

#endif
