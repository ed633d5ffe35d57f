// The command line of lapdread. Each option is described once, in CLI11's App; --help, manual pages and
// completion are made from that.
#ifndef READER_COMMAND_LINE_H
#define READER_COMMAND_LINE_H

#include <CLI/CLI.hpp>
#include <memory>
#include <string>
#include <vector>

#include "reader/Options.h"
#include "reader/commands.h"

namespace reader {

// The description of all commands and options. Parsing it fills `options`, which must outlive it.
std::unique_ptr<CLI::App> describe(Options& options);

struct CommandLine {
    std::string told;                  // --help or --version: what to print instead of running anything
    const Command* command = nullptr;  // otherwise never null
    Options options;
};

// Without argv[0]. The first word may name a command; without one it is `list`. Throws UsageError.
CommandLine parseCommandLine(std::vector<std::string> words);

}  // namespace reader

#endif
