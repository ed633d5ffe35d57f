#include "manual/completion.h"

namespace manual {

namespace {

constexpr char callReferences[] = R"zsh(
_@PROGRAM@_references() {
  local word
  for word in ${words[2,CURRENT-1]}; do
    [[ -f $word ]] || continue
    compadd -- ${(f)"$(@PROGRAM@ list --quiet --columns ref --layer 3 --first 2000 $word 2>/dev/null |
      tr -d ' ' | sed 's/[od]$//' | sort -u)"}
    return
  done
}
)zsh";

std::string replaced(std::string text, const std::string& from, const std::string& to) {
    for (std::size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

// Text inside '...' and inside the brackets behind an option.
std::string quoted(std::string text) {
    for (const auto* special : {"\\", "[", "]", ":"})
        text = replaced(text, special, std::string("\\") + special);
    return replaced(text, "'", "'\\''");
}

std::string actionFor(const Option& option, const Program& program) {
    switch (option.kind) {
        case ValueKind::choice: {
            std::string all;
            for (const std::string& choice : option.choices)
                all += (all.empty() ? "" : " ") + choice;
            return "(" + all + ")";
        }
        case ValueKind::file:
            return "_files";
        case ValueKind::folder:
            return "_files -/";
        case ValueKind::callReference:
            return "_" + program.name + "_references";
        case ValueKind::free:
        case ValueKind::none:
            break;
    }
    return " ";
}

// '*--output=[help]:OUT:_files'
std::string argumentsOf(const Command& command, const Program& program) {
    std::string text;
    for (const Option& option : command.options) {
        for (const std::string& name : option.names) {
            const bool isLong = name.starts_with("--");
            text += " \\\n        '*" + name;
            if (!option.form.empty())
                text += isLong ? "=" : "+";
            text += "[" + quoted(option.help) + "]";
            if (!option.form.empty())
                text += ":" + quoted(option.form) + ":" + actionFor(option, program);
            text += "'";
        }
    }
    return text;
}

std::string commandChoice(const Program& program) {
    std::string text = "  local -a commands\n  commands=(\n";
    for (const Command& command : program.commands) {
        if (!command.name.empty())
            text += "    '" + command.name + ":" + quoted(command.summary) + "'\n";
    }
    return text + "  )\n" + "  local command=" + program.commands.front().name + "\n" +
           "  if (( CURRENT > 2 )) && (( ${+commands[(r)${words[2]}:*]} )); then\n"
           "    command=${words[2]}\n"
           "    shift words; (( CURRENT-- ))\n"
           "  elif (( CURRENT == 2 )) && [[ $PREFIX != -* ]]; then\n"
           "    _describe -t commands command commands\n"
           "  fi\n";
}

}  // namespace

std::string zshCompletion(const Program& program) {
    std::string text = "#compdef " + program.name + "\n";
    text += replaced(callReferences, "@PROGRAM@", program.name);
    text += "\n_" + program.name + "() {\n";
    if (program.hasCommands())
        text += commandChoice(program);
    else
        text += "  local command=\n";
    text += "  case $command in\n";
    for (const Command& command : program.commands) {
        text += "    '" + command.name + "')\n      _arguments" + argumentsOf(command, program);
        text += program.runsAnother
                    ? " \\\n        '(-)--[program]:program:_command_names -e' '*::words:_normal' ;;\n"
                    : " \\\n        '*:file:_files' ;;\n";
    }
    return text + "  esac\n}\n\n_" + program.name + " \"$@\"\n";
}

}  // namespace manual
