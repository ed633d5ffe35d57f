// The launcher's command line.
#ifndef SOFTBOARD_COMMAND_LINE_H
#define SOFTBOARD_COMMAND_LINE_H

#include <functional>
#include <string>
#include <vector>

#include "softboard/settings.h"

namespace CLI {
class App;
}

namespace softboard {

struct CommandLine {
    std::string told;  // for --help or --version: the text to print instead of starting the program
    Settings settings;
    std::optional<uint32_t> dchannels;
    std::optional<std::string> scenario;
    std::optional<std::string> journal;
    std::vector<Fault> faults;         // those of the scenario file are added to them
    std::vector<std::string> program;  // the program and its arguments
};

// `arguments` are those of the launcher, without argv[0]. Throws BadInput.
CommandLine parseCommandLine(const std::vector<std::string>& arguments);

// Calls `visit` with the description of the options. Parser and --help are made from it, and so are the
// manual page and completion.
void showDescription(const std::function<void(const CLI::App&)>& visit);

// Makes the scenario that the command line asks for: reads the scenario file and the captures, and makes the
// journal's path absolute. Throws BadInput.
Scenario scenarioOf(const CommandLine& commandLine);

}  // namespace softboard

#endif
