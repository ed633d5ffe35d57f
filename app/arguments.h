// Reads the command line into settings.
#ifndef APP_ARGUMENTS_H
#define APP_ARGUMENTS_H

#include <array>

namespace app {

// The settings. parseArgs sets them before any other thread starts.
inline int boardnumber = 0;
inline int INST_NUM = 1;                       // the D channel
inline std::array<char, 100> log_file_name{};  // ends with a NUL

// Reads the arguments. When they ask for help or are wrong, prints the usage and ends the process with status
// 0.
void parseArgs(int argc, char** argv);
// Reads the arguments like parseArgs, but returns false instead of showing the usage.
bool readArgs(int argc, char** argv);

}  // namespace app

#endif
