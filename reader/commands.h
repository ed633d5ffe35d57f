// The commands of lapdread. A command is a source of its own and a row of the table in commands.cc.
#ifndef READER_COMMANDS_H
#define READER_COMMANDS_H

#include <span>
#include <string_view>

#include "reader/OptionRow.h"

namespace reader {

class Chatter;

struct Command {
    std::string_view name;
    std::string_view words;     // what follows the options: "[FILE...]"
    std::string_view summary;   // a line
    std::string_view examples;  // "  lapdread ...\n      what it does\n"
    OptionGroup options;        // those that not every command has
    // Returns the exit status; throws UsageError, FileError or ReaderGone.
    int (*run)(const Options&, Chatter&);
};

// In the order in which --help shows them; the first is run when none is named.
std::span<const Command> commands();

// Null if there is none of this name.
const Command* commandNamed(std::string_view name);

}  // namespace reader

#endif
