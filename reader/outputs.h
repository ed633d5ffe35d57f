// Which file a command may write over.
#ifndef READER_OUTPUTS_H
#define READER_OUTPUTS_H

#include <span>
#include <string>
#include <string_view>

namespace reader {

// Throws FileError if the file exists, is a regular one, and is neither empty nor begins with what
// `looksRight` accepts; or if it is one of the inputs. `form` is for the message: "a pcapng file". True if
// the file is new or a regular one, so that opening it leaves it empty.
bool checkOutput(const std::string& path, std::span<const std::string> inputs, std::string_view form,
                 bool (*looksRight)(std::string_view beginning));

// Throws FileError if the descriptor leads to a regular file that is one of the inputs, by whatever name:
// what is read would grow as it is written.
void checkNoInput(int descriptor, const std::string& name, std::span<const std::string> inputs);

// The first octets of a file, as far as they tell its form; nothing of one that cannot be read.
std::string beginningOf(const std::string& path);

// For outputs whose form nobody can tell from their beginning: such a file must be empty.
inline bool looksLikeNothing(std::string_view /*beginning*/) { return false; }

}  // namespace reader

#endif
