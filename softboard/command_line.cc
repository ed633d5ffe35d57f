#include "softboard/command_line.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <filesystem>

namespace softboard {

namespace {

constexpr const char* about = "Runs PROGRAM on simulated KV9 boards, which play recorded D-channel frames.";

const char* const examples =
    R"(softboard looks for PROGRAM in its own folder, then on PATH. Standard input, signals and exit status are those of
PROGRAM. Without options, a built-in capture of calls plays on D channel 1 of board 1 again and again.

Examples:
  softboard -- lapdmon -b1
      the built-in capture
  softboard --frames day.pcap --protocol ni2 --rate 20 --loop -- lapdmon -b1
      20 frames a second of day.pcap on an NI2 trunk, again and again
  softboard --board 3 --dchannels 2 --rate max -- lapdmon -b3 -d2
      as fast as the program reads, once
  softboard --scenario two.toml --journal talk.txt -- lapdmon -b1 -d2
      a file with settings for each D channel; every message is written to talk.txt

Exit status: that of PROGRAM; 2 for a bad option, file or capture (PROGRAM is not started); 126 when PROGRAM cannot
be executed, 127 when it is not found.
)";

class Help : public CLI::Formatter {
  public:
    std::string make_usage(const CLI::App* /*app*/, std::string /*name*/) const override {
        return "Usage: softboard [options] -- PROGRAM ARGS...\n";
    }
};

// Adds an option whose text becomes a setting by `parse`. A BadInput of `parse` becomes CLI11's error, with
// the name of the option.
template <class T, class Parse>
void addParsed(CLI::App& app, const char* name, std::optional<T>& setting, Parse parse, const char* help,
               const char* form) {
    app.add_option_function<std::string>(
           name,
           [&setting, parse, name](const std::string& text) {
               try {
                   setting = parse(text);
               } catch (const BadInput& error) {
                   throw CLI::ValidationError(name, error.what());
               }
           },
           help)
        ->type_name(form);
}

void addOptions(CLI::App& app, CommandLine& to) {
    app.add_option("--frames", to.settings.frames,
                   "Capture to play: pcap or pcapng, link type 177 (LINUX_LAPD) or 203 (LAPD)")
        ->type_name("FILE");
    addParsed(app, "--protocol", to.settings.protocol, parseProtocol,
              "Protocol type of the trunk (default: net5); a number stands for itself",
              "4ess|5ess|dms100|ntt|net5|ni2|N");
    addParsed(app, "--rate", to.settings.rate, parseRate,
              "As recorded, so many frames a second, or as fast as the program reads (default: recorded)",
              "recorded|FPS|max");
    app.add_flag_callback(
        "--loop", [&to] { to.settings.loop = true; },
        "Play the frames again and again (default for the built-in capture at recorded rate)");
    app.add_flag_callback(
        "--no-loop", [&to] { to.settings.loop = false; }, "Play the frames once (default otherwise)");
    addParsed(
        app, "--board", to.settings.board,
        [](const std::string& text) { return parseNumberIn(text, 0, largestBoard); },
        "Number of the board (default: 1)", "N");
    addParsed(
        app, "--dchannels", to.dchannels,
        [](const std::string& text) { return parseNumberIn(text, 1, mostDChannels); },
        "How many D channels the board has, numbered from 1 (default: 1)", "N");
    app.add_option(
           "--scenario", to.scenario,
           "TOML file with these settings, also for each D channel; options override those at its top")
        ->type_name("FILE");
    app.add_option("--journal", to.journal, "Write every message between program and board to FILE")
        ->type_name("FILE");
    app.add_option_function<std::vector<std::string>>(
           "--fault",
           [&to](const std::vector<std::string>& texts) {
               for (const std::string& text : texts) {
                   try {
                       to.faults.push_back(parseFaultSetting(text));
                   } catch (const BadInput& error) {
                       throw CLI::ValidationError("--fault", error.what());
                   }
               }
           },
           "Something that the board or the library does wrong (list below); may be given several times")
        ->expected(1)
        ->take_all()
        ->type_name("NAME[=N]");
    app.set_help_flag("--help,-h", "Print this and exit");
    app.set_version_flag("--version", "softboard " SOFTBOARD_VERSION, "Print the version and exit");
}

// The list of faults in the help, a line each.
std::string faultList() {
    std::string list = "Faults (N counts from 1; the number in brackets is used if none is given):\n";
    for (const FaultName& row : faultNames()) {
        std::string form = std::string("  ") + row.name;
        if (row.takesNumber) {
            form += "=N";
        }
        form.resize(std::max<size_t>(form.size() + 1, 30), ' ');
        list += form + row.help;
        list += row.takesNumber ? " [" + std::to_string(row.otherwise) + "]\n" : "\n";
    }
    return list;
}

void describe(CLI::App& app, CommandLine& to) {
    app.formatter(std::make_shared<Help>());
    app.footer(faultList() + "\n" + examples);
    addOptions(app, to);
}

std::string absolute(const std::string& path) { return std::filesystem::absolute(path).string(); }

}  // namespace

CommandLine parseCommandLine(const std::vector<std::string>& arguments) {
    CommandLine commandLine;
    CLI::App app(about, "softboard");
    describe(app, commandLine);
    const auto separator = std::find(arguments.begin(), arguments.end(), "--");
    std::vector<std::string> options(arguments.begin(), separator);
    std::reverse(options.begin(), options.end());  // CLI11 takes the last word first
    try {
        app.parse(options);
    } catch (const CLI::CallForHelp&) {
        commandLine.told = app.help();
    } catch (const CLI::CallForVersion& version) {
        commandLine.told = std::string(version.what()) + "\n";
    } catch (const CLI::ParseError& error) {
        throw BadInput(error.what());
    }
    if (separator != arguments.end()) {
        commandLine.program.assign(separator + 1, arguments.end());
    }
    if (commandLine.told.empty() && commandLine.program.empty()) {
        throw BadInput("no program to run: softboard [options] -- PROGRAM ARGS... (--help tells more)");
    }
    return commandLine;
}

void showDescription(const std::function<void(const CLI::App&)>& visit) {
    CommandLine unused;
    CLI::App app(about, "softboard");
    describe(app, unused);
    visit(app);
}

Scenario scenarioOf(const CommandLine& commandLine) {
    std::optional<ScenarioFile> file;
    if (commandLine.scenario) {
        file = readScenarioFile(*commandLine.scenario);
    }
    Scenario scenario = resolve(commandLine.settings, commandLine.dchannels, file ? &*file : nullptr);
    scenario.faults.insert(scenario.faults.end(), commandLine.faults.begin(), commandLine.faults.end());
    if (commandLine.journal) {
        scenario.journal = *commandLine.journal;
    }
    if (!scenario.journal.empty()) {
        scenario.journal = absolute(scenario.journal);
    }
    return scenario;
}

}  // namespace softboard
