// The command line of lapdread: what it says, and which options there are.
#ifndef READER_COMMAND_LINE_H
#define READER_COMMAND_LINE_H

#include <functional>
#include <span>
#include <string>
#include <vector>

#include "reader/OptionRow.h"
#include "reader/commands.h"

namespace CLI {
class App;
}

namespace reader {

// The options that all commands have, besides the filters (Filter.h).
std::span<const OptionGroup> commonOptions();

struct CommandLine {
    std::string told;                  // --help or --version: what to print instead of running anything
    const Command* command = nullptr;  // otherwise never null
    Options options;
};

// Without argv[0]. The first word may name a command; without one it is `list`. Throws UsageError.
CommandLine parseCommandLine(std::vector<std::string> words);

// Shows `visit` the description that parser and --help are made from; manual pages and completion are made
// from it.
void showDescription(const std::function<void(const CLI::App&)>& visit);

}  // namespace reader

#endif
