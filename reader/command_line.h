// Parses the command line of lapdread.
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

// `words` are without argv[0]. The first word may name a command; if it does not, the command is `list`.
// Throws UsageError.
CommandLine parseCommandLine(std::vector<std::string> words);

// Calls `visit` with the description of the options. Parser and --help are made from it, and so are manual
// pages and completion.
void showDescription(const std::function<void(const CLI::App&)>& visit);

}  // namespace reader

#endif
