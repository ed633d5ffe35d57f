// The launcher's command line.
#ifndef SOFTBOARD_COMMAND_LINE_H
#define SOFTBOARD_COMMAND_LINE_H

#include <string>
#include <vector>

#include "softboard/settings.h"

namespace softboard {

struct CommandLine {
    std::string told;  // --help or --version: what to print instead of running anything
    Settings settings;
    std::optional<uint32_t> dchannels;
    std::optional<std::string> scenario;
    std::optional<std::string> journal;
    std::vector<Fault> faults;         // beside those of the scenario file
    std::vector<std::string> program;  // with its arguments
};

// Without argv[0]; throws BadInput.
CommandLine parseCommandLine(const std::vector<std::string>& arguments);

// What to play, captures read and the journal's path made absolute; throws BadInput.
Scenario scenarioOf(const CommandLine& commandLine);

}  // namespace softboard

#endif
