// Makes manual pages and completion from the programs' own descriptions:
//     generate-manual PAGES OUT VERSION DATE
// PAGES is the folder of the written pages, OUT one that gets man/, bash/ and zsh/.
#include <CLI/CLI.hpp>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <sstream>

#include "fleet/ship/command_line.h"
#include "fleet/store/command_line.h"
#include "manual/completion.h"
#include "manual/roff.h"
#include "reader/command_line.h"
#include "reader/commands.h"
#include "relay/command_line.h"
#include "softboard/command_line.h"
#include "softboard/faults.h"

namespace {

namespace fs = std::filesystem;
using namespace manual;

template <class Show>
Program described(Show show) {
    Program program;
    show([&](const CLI::App& app) { program = programOf(app); });
    return program;
}

Program lapdread() {
    Program program = described(reader::showDescription);
    for (Command& command : program.commands)
        command.words = reader::commandNamed(command.name)->words;
    return program;
}

Program softboard() {
    Program program = described(softboard::showDescription);
    program.runsAnother = true;
    std::vector<std::string> faults;
    for (const softboard::FaultName& row : softboard::faultNames())
        faults.push_back(row.name);
    setChoices(program, "--fault", faults);
    return program;
}

// Describes a program that works without a command and also has commands.
template <class Show>
Program alone(Show show) {
    Program program;
    show([&](const CLI::App& app) { program = programThatWorksAlone(app); });
    return program;
}

// lapdmon reads its command line letter by letter. Its page is a written one.
Program lapdmon() {
    return {"lapdmon",
            {{"",
              "",
              "",
              "",
              {{{"-b"},
                "",
                "number of the board, directly behind the letter: -b1",
                "Options",
                ValueKind::none,
                {}},
               {{"-d"},
                "",
                "number of the D channel, directly behind the letter: -d1",
                "Options",
                ValueKind::none,
                {}},
               {{"-h"}, "", "show the usage", "Options", ValueKind::none, {}},
               {{"-f"}, "FILE", "name of the log; comes last", "Options", ValueKind::file, {}}}}},
            "",
            false};
}

std::string contentsOf(const fs::path& path) {
    std::ifstream file(path);
    std::ostringstream contents;
    if (!(contents << file.rdbuf()))
        throw std::runtime_error("cannot read " + path.string());
    return contents.str();
}

void write(const fs::path& path, const std::string& text) {
    fs::create_directories(path.parent_path());
    std::ofstream file(path);
    if (!(file << text).flush())
        throw std::runtime_error("cannot write " + path.string());
}

const Program& programNamed(const std::string& name, const std::vector<Program>& programs) {
    for (const Program& program : programs) {
        if (program.name == name)
            return program;
    }
    return programs.front();  // the page is not about a program and uses no part of a description
}

void generate(const fs::path& pages, const fs::path& out, const Edition& edition) {
    const std::vector<Program> programs{lapdmon(),
                                        lapdread(),
                                        softboard(),
                                        described(relay::showDescription),
                                        alone(fleet::showShipDescription),
                                        alone(fleet::showStoreDescription)};
    fs::remove_all(out);
    for (const auto& entry : fs::directory_iterator(pages)) {
        const Program& program = programNamed(entry.path().stem().string(), programs);
        write(out / "man" / entry.path().filename(), filledPage(contentsOf(entry.path()), program, edition));
    }
    for (const Program& program : programs) {
        write(out / "bash" / program.name, bashCompletion(program));
        write(out / "zsh" / ("_" + program.name), zshCompletion(program));
        if (program.commands.front().name.empty())
            continue;  // a program without commands has one page
        for (const Command& command : program.commands)
            write(out / "man" / (program.name + "-" + command.name + ".1"),
                  commandPage(program, command, edition));
    }
}

}  // namespace

int main(int argc, char** argv) try {
    if (argc != 5) {
        std::cerr << "usage: generate-manual PAGES OUT VERSION DATE\n";
        return 1;
    }
    generate(argv[1], argv[2], {argv[3], argv[4]});
} catch (const std::exception& error) {
    std::cerr << "generate-manual: " << error.what() << "\n";
    return 1;
}
