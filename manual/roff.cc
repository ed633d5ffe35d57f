#include "manual/roff.h"

#include <algorithm>
#include <cctype>
#include <stdexcept>

namespace manual {

namespace {

constexpr char otherTitle[] = "Options";

std::string inCapitals(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(),
                   [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
    return text;
}

std::string bold(const std::string& text) { return "\\fB" + escaped(text) + "\\fR"; }
std::string italic(const std::string& text) { return "\\fI" + escaped(text) + "\\fR"; }

std::string sentence(const std::string& text) {
    const bool ends = !text.empty() && std::string(".!?)").find(text.back()) != std::string::npos;
    return escaped(text) + (ends ? "\n" : ".\n");
}

std::string optionAsRoff(const Option& option) {
    std::string roff = ".TP\n";
    for (std::size_t i = 0; i < option.names.size(); ++i)
        roff += (i == 0 ? "" : ", ") + bold(option.names[i]);
    if (!option.form.empty())
        roff += " " + italic(option.form);
    return roff + "\n" + sentence(option.help);
}

std::vector<std::string> titlesOf(const std::vector<Option>& options) {
    std::vector<std::string> titles;
    for (const Option& option : options) {
        if (std::find(titles.begin(), titles.end(), option.group) == titles.end())
            titles.push_back(option.group);
    }
    // The options that all programs have come last.
    std::stable_partition(titles.begin(), titles.end(),
                          [](const std::string& title) { return title != otherTitle; });
    return titles;
}

std::string replaced(std::string text, const std::string& from, const std::string& to) {
    for (std::size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

// Breaks lines so that they have at most 80 octets, as is usual in roff sources. Keeps macros, and lines
// between .EX and .EE, as they are.
std::string folded(const std::string& page) {
    constexpr std::size_t width = 80;
    std::string roff;
    bool asItIs = false;
    for (std::string line : linesOf(page)) {
        asItIs = line == ".EX" || (asItIs && line != ".EE");
        while (!asItIs && line.size() > width && line[0] != '.') {
            std::size_t at = line.rfind(' ', width);
            while (at != std::string::npos && at != 0 && line[at + 1] == '.')  // would begin a macro
                at = line.rfind(' ', at - 1);
            if (at == std::string::npos || at == 0)
                break;
            roff += line.substr(0, at) + "\n";
            line.erase(0, at + 1);
        }
        roff += line + "\n";
    }
    return roff;
}

std::string listNamed(const Program& program, const std::string& title) {
    const std::string section = sectionOf(program.footer, title);
    if (section.empty())
        throw std::runtime_error(program.name + " --help has no list \"" + title + "\"");
    return listAsRoff(section);
}

}  // namespace

std::string escaped(const std::string& text) {
    std::string roff;
    for (const char c : text) {
        switch (c) {
            case '\\':
                roff += "\\e";
                break;
            case '-':
                roff += "\\-";
                break;
            case '`':
                roff += "\\(ga";
                break;
            case '~':
                roff += "\\(ti";
                break;
            case '^':
                roff += "\\(ha";
                break;
            case '\'':
                roff += "\\(aq";
                break;
            default:
                roff += c;
        }
    }
    return roff.starts_with('.') ? "\\&" + roff : roff;
}

std::string optionsAsRoff(const std::vector<Option>& options) {
    std::string roff;
    const std::vector<std::string> titles = titlesOf(options);
    for (const std::string& title : titles) {
        if (titles.size() > 1)
            roff += ".SS " + (title == otherTitle ? "General" : escaped(title)) + "\n";
        for (const Option& option : options)
            roff += option.group == title ? optionAsRoff(option) : "";
    }
    return roff;
}

std::string commandsAsRoff(const Program& program) {
    std::string roff;
    for (const Command& command : program.commands)
        roff +=
            ".TP\n.BR " + escaped(program.name + "-" + command.name) + " (1)\n" + sentence(command.summary);
    return roff;
}

std::string listAsRoff(const std::string& lines) {
    std::string roff;
    for (const std::string& line : linesOf(lines)) {
        const std::size_t begin = std::min(line.find_first_not_of(' '), line.size());
        const std::string text = line.substr(begin);
        if (begin > 2) {
            roff += escaped(text) + "\n";
            continue;
        }
        const std::size_t gap = std::min(text.find("  "), text.size());
        roff += ".TP\n" + bold(text.substr(0, gap)) + "\n";
        if (const std::size_t help = text.find_first_not_of(' ', gap); help != std::string::npos)
            roff += escaped(text.substr(help)) + "\n";
    }
    return roff;
}

std::string commandPage(const Program& program, const Command& command, const Edition& edition) {
    const std::string name = program.name + "-" + command.name;
    return folded(
        ".TH " + inCapitals(escaped(name)) + " 1 " + edition.date + " \"lapdmon " + edition.version +
        "\" \"User Commands\"\n" +  //
        ".SH NAME\n" + escaped(name) + " \\- " + escaped(command.summary) + "\n" + ".SH SYNOPSIS\n" +
        bold(program.name + " " + command.name) + " [" + italic("OPTIONS") + "] " + italic(command.words) +
        "\n" +  //
        ".SH DESCRIPTION\nA command of\n.BR " + escaped(program.name) +
        " (1),\nwhich tells what the inputs may be, the exit status, and how options and filters work "
        "together.\n" +
        ".SH OPTIONS\n" + optionsAsRoff(command.options) +  //
        ".SH EXAMPLES\n" + listAsRoff(sectionOf(command.footer, "Examples:")) + ".SH SEE ALSO\n.BR " +
        escaped(program.name) + " (1)\n");
}

std::string filledPage(const std::string& source, const Program& program, const Edition& edition) {
    constexpr std::string_view list = "@LIST ";
    constexpr std::string_view own = "@OPTIONS ";
    std::string page;
    for (const std::string& line : linesOf(source)) {
        if (line == "@OPTIONS@")
            page += optionsAsRoff(sharedOptions(program));
        else if (line == "@COMMANDS@")
            page += commandsAsRoff(program);
        else if (line.starts_with(own))
            page += optionsAsRoff(ownOptions(program, line.substr(own.size(), line.size() - own.size() - 1)));
        else if (line.starts_with(list))
            page += listNamed(program, line.substr(list.size(), line.size() - list.size() - 1));
        else
            page += replaced(replaced(line, "@VERSION@", edition.version), "@DATE@", edition.date) + "\n";
    }
    return folded(page);
}

}  // namespace manual
