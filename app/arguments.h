// The command line and the settings it makes.
#ifndef APP_ARGUMENTS_H
#define APP_ARGUMENTS_H

#include <array>

namespace app {

// Program-wide, filled by parseArgs before any thread starts.
inline int boardnumber = 0;
inline int INST_NUM = 1;                       // the D channel
inline std::array<char, 100> log_file_name{};  // terminated

// Reads the arguments. When they ask for help or cannot be used, prints the usage and ends the process with
// status 0.
void parseArgs(int argc, char** argv);
// As parseArgs, but returns false where that shows the usage.
bool readArgs(int argc, char** argv);

}  // namespace app

#endif
