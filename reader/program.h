// Runs lapdread.
#ifndef READER_PROGRAM_H
#define READER_PROGRAM_H

#include <string>
#include <vector>

namespace reader {

// `words` are the arguments without argv[0]. Returns the exit status. Writes data to standard output and
// everything else to the standard error stream. Throws nothing. Call it once, before there are other threads,
// because it ignores SIGPIPE and may set the time zone.
int runProgram(const std::vector<std::string>& words);

}  // namespace reader

#endif
