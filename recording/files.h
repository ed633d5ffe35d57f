// Files written whole.
#ifndef RECORDING_FILES_H
#define RECORDING_FILES_H

#include <optional>
#include <string>
#include <string_view>

namespace recording {

// Writes all of it, however often the system writes less or is interrupted. Returns 0 or the error's number.
int writeAll(int descriptor, std::string_view text);

// Puts a file with this text in the place of the old one in one step (rename): whoever reads it sees the old
// text or the new one. Its last step has the name PATH.new. Returns what is wrong, or nothing.
std::optional<std::string> replaceFile(const std::string& path, std::string_view text);

}  // namespace recording

#endif
