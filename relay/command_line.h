// The command line of kv9relayd.
#ifndef RELAY_COMMAND_LINE_H
#define RELAY_COMMAND_LINE_H

#include <functional>
#include <stdexcept>
#include <string>

#include "relay/server.h"

namespace CLI {
class App;
}

namespace relay {

// The command line is wrong. what() says how, and what to do.
class BadCommandLine : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct CommandLine {
    Options options;
    std::string told;  // for --help or --version: the text to print instead of starting the relay
};

// Throws BadCommandLine.
CommandLine parseCommandLine(int argc, const char* const* argv);

// Calls `visit` with the description of the options. Parser and --help are made from it, and so are the
// manual page and completion.
void showDescription(const std::function<void(const CLI::App&)>& visit);

}  // namespace relay

#endif
