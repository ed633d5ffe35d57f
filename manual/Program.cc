#include "manual/Program.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <iterator>
#include <sstream>
#include <utility>

namespace manual {

namespace {

// The words of "auto|always|never|N" that are values. Words in capitals stand for a value.
std::vector<std::string> choicesOf(const std::string& form) {
    std::vector<std::string> choices;
    std::istringstream words(form);
    for (std::string word; form.find('|') != std::string::npos && std::getline(words, word, '|');) {
        if (std::none_of(word.begin(), word.end(), [](char c) { return c >= 'A' && c <= 'Z'; }))
            choices.push_back(word);
    }
    return choices;
}

ValueKind kindOf(const Option& option) {
    if (option.form.empty())
        return ValueKind::none;
    if (!option.choices.empty())
        return ValueKind::choice;
    if (option.form == "FILE" || option.form == "OUT")
        return ValueKind::file;
    if (option.form == "DIR")
        return ValueKind::folder;
    return option.form == "REF" ? ValueKind::callReference : ValueKind::free;
}

Option optionOf(const CLI::Option& described) {
    Option option;
    for (const std::string& name : described.get_snames())
        option.names.push_back("-" + name);
    for (const std::string& name : described.get_lnames())
        option.names.push_back("--" + name);
    if (described.get_type_size() != 0)
        option.form = described.get_type_name();
    option.help = described.get_description();
    option.group = described.get_group();
    option.choices = choicesOf(option.form);
    option.kind = kindOf(option);
    return option;
}

Command commandOf(const CLI::App& app) {
    Command command;
    command.summary = app.get_description();
    command.footer = app.get_footer();
    for (const CLI::Option* option : app.get_options()) {
        if (!option->get_group().empty() && !option->get_positional())
            command.options.push_back(optionOf(*option));
    }
    return command;
}

bool has(const Command& command, const Option& option) {
    return std::any_of(command.options.begin(), command.options.end(), [&](const Option& other) {
        return other.names == option.names && other.help == option.help;
    });
}

}  // namespace

Program programOf(const CLI::App& app) {
    Program program;
    program.name = app.get_name();
    program.footer = app.get_footer();
    for (const CLI::App* each : app.get_subcommands([](const CLI::App*) { return true; })) {
        program.commands.push_back(commandOf(*each));
        program.commands.back().name = each->get_name();
    }
    if (program.commands.empty())
        program.commands.push_back(commandOf(app));
    return program;
}

Program programThatWorksAlone(const CLI::App& app) {
    Program program = programOf(app);
    const Command alone = commandOf(app);
    for (Command& command : program.commands) {
        std::vector<Option> options = alone.options;
        std::copy_if(command.options.begin(), command.options.end(), std::back_inserter(options),
                     [&](const Option& option) { return !has(alone, option); });
        command.options = std::move(options);
    }
    program.commands.insert(program.commands.begin(), alone);
    return program;
}

std::vector<Option> sharedOptions(const Program& program) {
    std::vector<Option> shared;
    for (const Option& option : program.commands.front().options) {
        if (std::all_of(program.commands.begin(), program.commands.end(),
                        [&](const Command& command) { return has(command, option); }))
            shared.push_back(option);
    }
    return shared;
}

std::vector<Option> ownOptions(const Program& program, const std::string& name) {
    const Command shared{"", "", "", "", sharedOptions(program)};
    std::vector<Option> own;
    for (const Command& command : program.commands) {
        for (const Option& option : command.options) {
            if (command.name == name && !has(shared, option))
                own.push_back(option);
        }
    }
    return own;
}

void setChoices(Program& program, const std::string& name, const std::vector<std::string>& choices) {
    for (Command& command : program.commands) {
        for (Option& option : command.options) {
            if (std::find(option.names.begin(), option.names.end(), name) != option.names.end()) {
                option.kind = ValueKind::choice;
                option.choices = choices;
            }
        }
    }
}

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);)
        lines.push_back(line);
    return lines;
}

std::string sectionOf(const std::string& footer, const std::string& title) {
    std::string section;
    bool inside = false;
    for (const std::string& line : linesOf(footer)) {
        if (line.empty())
            inside = false;
        if (inside)
            section += line + "\n";
        if (line.starts_with(title))
            inside = true;
    }
    return section;
}

}  // namespace manual
