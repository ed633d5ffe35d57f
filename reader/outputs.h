// Decides which file a command may overwrite.
#ifndef READER_OUTPUTS_H
#define READER_OUTPUTS_H

#include <span>
#include <string>
#include <string_view>

namespace reader {

// Throws FileError if the path leads to a regular file that is one of the inputs, or that is not empty and
// does not begin as `looksRight` wants. `form` names that beginning in the message: "a pcapng file". Returns
// true if there is no such file yet or it is a regular one, so that opening it for output empties it; false
// for a device or a FIFO.
bool checkOutput(const std::string& path, std::span<const std::string> inputs, std::string_view form,
                 bool (*looksRight)(std::string_view beginning));

// Throws FileError if the descriptor leads to a regular file that is one of the inputs, whatever its name,
// because that file would grow while it is read.
void checkNoInput(int descriptor, const std::string& name, std::span<const std::string> inputs);

// The first octets of a file, enough to recognise its form; empty if the file cannot be read.
std::string beginningOf(const std::string& path);

// The `looksRight` of outputs that cannot be recognised by their beginning. Such a file must be empty.
inline bool looksLikeNothing(std::string_view /*beginning*/) { return false; }

}  // namespace reader

#endif
