// Describes a program's command line for manual pages and completion. The description is read from the
// parser, which also makes --help.
#ifndef MANUAL_PROGRAM_H
#define MANUAL_PROGRAM_H

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace manual {

// What the value of an option is, for completion.
enum class ValueKind { none, free, choice, file, folder, callReference };

struct Option {
    std::vector<std::string> names;  // "-o", "--output"
    std::string form;                // of its value: "FILE"; empty if it takes none
    std::string help;
    std::string group;  // the title above it in --help
    ValueKind kind = ValueKind::none;
    std::vector<std::string> choices;  // for ValueKind::choice
};

struct Command {
    std::string name;  // empty for a program without commands, and for what a program does without one
    std::string summary;
    std::string words;   // what follows the options
    std::string footer;  // what --help shows behind the options
    std::vector<Option> options;
};

struct Program {
    std::string name;
    std::vector<Command> commands;  // at least one
    std::string footer;
    bool runsAnother = false;  // behind "--" come another program and its words

    bool hasCommands() const { return commands.size() > 1 || !commands.front().name.empty(); }
};

// The options and commands of a command line. Options that --help hides are left out.
Program programOf(const CLI::App& app);
// The same for a program that also works without a command. Its first Command has no name; the others take
// the options of this one as well.
Program programThatWorksAlone(const CLI::App& app);

// The options of a command that not all commands have.
std::vector<Option> ownOptions(const Program& program, const std::string& command);

// The options that each of the commands has.
std::vector<Option> sharedOptions(const Program& program);

// Says that an option, for example "--fault", takes one of these words.
void setChoices(Program& program, const std::string& option, const std::vector<std::string>& choices);

// Returns a section of a footer: the lines after the title ("Examples:") up to the next empty line.
std::string sectionOf(const std::string& footer, const std::string& title);

std::vector<std::string> linesOf(const std::string& text);

}  // namespace manual

#endif
