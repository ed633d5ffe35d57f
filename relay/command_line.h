#ifndef RELAY_COMMAND_LINE_H
#define RELAY_COMMAND_LINE_H

#include <stdexcept>
#include <string>

#include "relay/server.h"

namespace relay {

// What is wrong with the command line, and what to do.
class BadCommandLine : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct CommandLine {
    Options options;
    std::string told;  // what --help or --version asks for; then nothing else counts
};

// Throws BadCommandLine.
CommandLine parseCommandLine(int argc, const char* const* argv);

}  // namespace relay

#endif
