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
    std::string_view words;     // the words after the options: "[FILE...]"
    std::string_view summary;   // one line
    std::string_view examples;  // "  lapdread ...\n      what it does\n"
    OptionGroup options;        // the options of this command that not every command has
    // Returns the exit status; throws UsageError, FileError or ReaderGone.
    int (*run)(const Options&, Chatter&);
    bool takesFilesAlone = false;  // the command reads files and cannot read a store
};

// All commands, in the order in which --help shows them. The first is run if the command line names none.
std::span<const Command> commands();

// The command of this name, or null.
const Command* commandNamed(std::string_view name);

}  // namespace reader

#endif
