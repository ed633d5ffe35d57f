// Exceptions that end lapdread early, and the exit status of each.
#ifndef READER_ERRORS_H
#define READER_ERRORS_H

#include <stdexcept>

namespace reader {

enum ExitStatus { good = 0, badUsage = 1, cannotRead = 2, found = 3 };

// The command line is wrong; exit status 1.
class UsageError : public std::runtime_error {
    using std::runtime_error::runtime_error;
};

// An input cannot be opened or read, or an output cannot be written; exit status 2. The text names the file
// and the reason.
class FileError : public std::runtime_error {
    using std::runtime_error::runtime_error;
};

// A signal ended the program before it had anything to write. The output is left as it was. Exit status 0.
class StoppedEarly {};

// The reader of the output has closed the pipe. The program ends silently with exit status 0.
class ReaderGone {};

}  // namespace reader

#endif
