#include <algorithm>
#include <map>
#include <set>

#include "manual/completion.h"

namespace manual {

namespace {

// The call references in the first 2000 frames of the first file on the command line. That is enough to be
// useful, and quick with a log of any size.
constexpr char callReferences[] = R"(
_@PROGRAM@_references() {
    local word
    for word in "${COMP_WORDS[@]:1:COMP_CWORD-1}"; do
        [[ -f $word ]] || continue
        @PROGRAM@ list --quiet --columns ref --layer 3 --first 2000 "$word" 2>/dev/null |
            tr -d ' ' | sed 's/[od]$//' | sort -u
        return
    done
}
)";

// After "--" come a program and its arguments.
constexpr char anotherProgram[] = R"(
    local i
    for ((i = 1; i < COMP_CWORD; ++i)); do
        [[ ${COMP_WORDS[i]} == -- ]] || continue
        if ((COMP_CWORD == i + 1)); then
            COMPREPLY=($(compgen -c -- "$cur"))
        else
            compopt -o filenames 2>/dev/null
            COMPREPLY=($(compgen -f -- "$cur"))
        fi
        return
    done
)";

std::string replaced(std::string text, const std::string& from, const std::string& to) {
    for (std::size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

std::string joined(const std::vector<std::string>& words) {
    std::string all;
    for (const std::string& word : words)
        all += (all.empty() ? "" : " ") + word;
    return all;
}

std::string namesOf(const Command& command) {
    std::string all;
    for (const Option& option : command.options)
        all += (all.empty() ? "" : " ") + joined(option.names);
    return all;
}

std::string actionFor(const Option& option, const Program& program) {
    switch (option.kind) {
        case ValueKind::choice:
            return "COMPREPLY=($(compgen -W '" + joined(option.choices) + "' -- \"$cur\"))";
        case ValueKind::file:
            return "compopt -o filenames 2>/dev/null; COMPREPLY=($(compgen -f -- \"$cur\"))";
        case ValueKind::folder:
            return "compopt -o filenames 2>/dev/null; COMPREPLY=($(compgen -d -- \"$cur\"))";
        case ValueKind::callReference:
            return "COMPREPLY=($(compgen -W \"$(_" + program.name + "_references)\" -- \"$cur\"))";
        case ValueKind::free:
            return ":";
        case ValueKind::none:
            break;
    }
    return "";
}

// Whether every command that has an option of this name offers the same for it.
bool isTheSameEverywhere(const std::string& name, const std::string& action, const Program& program) {
    for (const Command& command : program.commands) {
        for (const Option& option : command.options) {
            const bool has = std::find(option.names.begin(), option.names.end(), name) != option.names.end();
            if (has && actionFor(option, program) != action)
                return false;
        }
    }
    return true;
}

// One row for each different thing to offer: *" --color" | "convert --to") ... ;;
std::string valueRows(const Program& program) {
    std::map<std::string, std::set<std::string>> patterns;
    for (const Command& command : program.commands) {
        for (const Option& option : command.options) {
            const std::string action = actionFor(option, program);
            for (const std::string& name : option.names) {
                if (!action.empty())
                    patterns[action].insert(isTheSameEverywhere(name, action, program)
                                                ? "*\" " + name + "\""
                                                : "\"" + command.name + " " + name + "\"");
            }
        }
    }
    std::string rows;
    for (const auto& [action, all] : patterns) {
        std::string pattern;
        for (const std::string& each : all) {
            if (!pattern.empty())
                pattern += " | ";
            pattern += each;
        }
        rows.append("        ").append(pattern).append(")\n            ");
        rows.append(action).append("\n            return ;;\n");
    }
    return rows;
}

std::string commandRows(const Program& program) {
    std::string rows;
    for (const Command& command : program.commands)
        rows += "        '" + command.name + "') options='" + namesOf(command) + "' ;;\n";
    return rows;
}

std::string commandNames(const Program& program, const std::string& between) {
    std::string all;
    for (const Command& command : program.commands) {
        if (!command.name.empty())
            all += (all.empty() ? "" : between) + command.name;
    }
    return all;
}

bool usesReferences(const Program& program) {
    for (const Command& command : program.commands) {
        for (const Option& option : command.options) {
            if (option.kind == ValueKind::callReference)
                return true;
        }
    }
    return false;
}

}  // namespace

std::string bashCompletion(const Program& program) {
    std::string text = "# bash completion for " + program.name + "\n";
    if (usesReferences(program))
        text += replaced(callReferences, "@PROGRAM@", program.name);
    text +=
        "\n_" + program.name + "() {\n" +
        "    local cur=${COMP_WORDS[COMP_CWORD]} prev=${COMP_WORDS[COMP_CWORD-1]} options IFS=$' \\t\\n'\n"
        "    local command='" +
        program.commands.front().name +
        "'\n"
        "    COMPREPLY=()\n"
        "    # \"--name=value\" is three words.\n"
        "    [[ $cur == = ]] && cur=\n"
        "    [[ $prev == = ]] && prev=${COMP_WORDS[COMP_CWORD-2]}\n";
    if (program.runsAnother)
        text += anotherProgram;
    if (program.hasCommands())
        text += "    case ${COMP_WORDS[1]} in\n        " + commandNames(program, " | ") +
                ") ((COMP_CWORD > 1)) && command=${COMP_WORDS[1]} ;;\n    esac\n";
    text += "    case \"$command $prev\" in\n" + valueRows(program) + "    esac\n";
    text += "    case $command in\n" + commandRows(program) + "    esac\n";
    text +=
        "    if [[ $cur == -* ]]; then\n"
        "        COMPREPLY=($(compgen -W \"$options\" -- \"$cur\"))\n"
        "        return\n"
        "    fi\n"
        "    compopt -o filenames 2>/dev/null\n"
        "    COMPREPLY=($(compgen -f -- \"$cur\"))\n";
    if (program.hasCommands())
        text += "    ((COMP_CWORD == 1)) && COMPREPLY+=($(compgen -W '" + commandNames(program, " ") +
                "' -- \"$cur\"))\n";
    return text + "}\ncomplete -F _" + program.name + " " + program.name + "\n";
}

}  // namespace manual
