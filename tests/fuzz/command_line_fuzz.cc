// The command lines of the three programs. The input's first octet chooses the program; its words follow,
// each with a zero octet or a line end behind it.
#include <algorithm>
#include <cstring>

#include "app/arguments.h"
#include "relay/command_line.h"
#include "softboard/command_line.h"
#include "tests/fuzz/fuzz.h"

namespace {

using Words = std::vector<std::string>;

Words wordsOf(const std::string& text) {
    constexpr std::string_view ends("\0\n", 2);
    Words words;
    std::size_t at = 0;
    while (at < text.size()) {
        const std::size_t end = std::min(text.find_first_of(ends, at), text.size());
        words.push_back(text.substr(at, end - at));
        at = end + 1;
    }
    return words;
}

// As main gets them.
class Arguments {
  public:
    explicit Arguments(Words words) : words_(std::move(words)) {
        words_.insert(words_.begin(), "program");
        for (std::string& word : words_)
            pointers_.push_back(word.data());
        pointers_.push_back(nullptr);
    }
    int count() const { return static_cast<int>(words_.size()); }
    char** values() { return pointers_.data(); }

  private:
    Words words_;
    std::vector<char*> pointers_;
};

void lapdmon(const Words& words) {
    Arguments arguments(words);
    app::log_file_name.fill('?');
    static_cast<void>(app::readArgs(arguments.count(), arguments.values()));
    const char* const end = std::find(app::log_file_name.begin(), app::log_file_name.end(), '\0');
    fuzz::require(end != app::log_file_name.end() && end != app::log_file_name.begin(),
                  "the log's name has an end, and a beginning");
}

// The files that the words name are files of this machine: none is opened.
void softboardLauncher(const Words& words) {
    try {
        softboard::CommandLine commandLine = softboard::parseCommandLine(words);
        commandLine.scenario.reset();
        commandLine.settings.frames.reset();
        softboard::Scenario scenario = softboard::scenarioOf(commandLine);
        scenario.captures.assign(scenario.captures.size(), {});
        fuzz::require(softboard::fromJson(softboard::toJson(scenario)) == scenario,
                      "a scenario is handed over as it is");
    } catch (const softboard::BadInput&) {
    }
}

void relayDaemon(const Words& words) {
    Arguments arguments(words);
    try {
        static_cast<void>(relay::parseCommandLine(arguments.count(), arguments.values()));
    } catch (const relay::BadCommandLine&) {
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    constexpr void (*programs[])(const Words&) = {lapdmon, softboardLauncher, relayDaemon};
    fuzz::Input input(data, size);
    const auto program = programs[input.octet() % std::size(programs)];
    program(wordsOf(input.text()));
    return 0;
}
