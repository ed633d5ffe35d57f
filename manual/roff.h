// Manual pages: the parts of them that are made from the description of a program.
#ifndef MANUAL_ROFF_H
#define MANUAL_ROFF_H

#include <string>

#include "manual/Program.h"

namespace manual {

// When and of what a page was made.
struct Edition {
    std::string version;
    std::string date;
};

// Ordinary text as roff source that shows the same characters.
std::string escaped(const std::string& text);

// Options under the titles that --help has.
std::string optionsAsRoff(const std::vector<Option>& options);

// The commands of a program, each with its summary.
std::string commandsAsRoff(const Program& program);

// Lines of --help: "  term   text", or "  term" and its text in lines that are indented more.
std::string listAsRoff(const std::string& lines);

// A whole page of one command.
std::string commandPage(const Program& program, const Command& command, const Edition& edition);

// A written page in which these lines are replaced: "@OPTIONS@", "@COMMANDS@", "@LIST title@" (a section of
// the program's footer); and within lines @VERSION@ and @DATE@. Throws std::runtime_error for a list that the
// footer does not have.
std::string filledPage(const std::string& source, const Program& program, const Edition& edition);

}  // namespace manual

#endif
