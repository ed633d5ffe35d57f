// The program from its arguments to its exit status.
#ifndef READER_PROGRAM_H
#define READER_PROGRAM_H

#include <string>
#include <vector>

namespace reader {

// Without argv[0]. Writes data to standard output and everything else to the standard error stream; throws
// nothing. Called once, before there are threads: it ignores SIGPIPE and may set the time zone.
int runProgram(const std::vector<std::string>& words);

}  // namespace reader

#endif
