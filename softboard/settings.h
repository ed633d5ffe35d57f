// The settings of the command line and of a scenario file, before they become a Scenario. A setting that was
// not given is empty.
#ifndef SOFTBOARD_SETTINGS_H
#define SOFTBOARD_SETTINGS_H

#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "softboard/scenario.h"

namespace softboard {

// A bad option, file or capture. what() names the place (option, file, line) and the reason.
class BadInput : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct Settings {
    std::optional<std::string> frames;  // a capture's path
    std::optional<uint32_t> protocol;
    std::optional<Rate> rate;
    std::optional<bool> loop;
    std::optional<uint32_t> board;
    std::optional<uint32_t> label;

    // These settings, and those of `base` for what is not given here.
    Settings over(const Settings& base) const;
};

// One [[dchannel]] of a scenario file. `place` is where it stands, for example "day.toml:7"; reports name it.
struct ChannelSettings {
    std::optional<uint32_t> number;
    Settings settings;
    std::string place;
};

struct ScenarioFile {
    Settings settings;  // those at the top of the file, for every D channel that does not give its own
    std::optional<uint32_t> dchannels;
    std::optional<std::string> journal;
    std::vector<Fault> faults;
    std::vector<ChannelSettings> channels;
    std::string path;
};

constexpr uint32_t mostDChannels = 255;
constexpr uint32_t largestBoard = 255;

// "4ess", "ni2", ... or a number; throws BadInput.
uint32_t parseProtocol(const std::string& text);
// "recorded", "max" or frames per second; throws BadInput.
Rate parseRate(const std::string& text);
Rate framesPerSecond(double rate);
// "reply-lost=3"; throws BadInput.
Fault parseFaultSetting(const std::string& text);
uint32_t parseNumberIn(const std::string& text, uint32_t least, uint32_t most);

// Makes the scenario from the command line and the scenario file (null: there is none), and reads the
// captures. A D channel's own settings come first, then the command line, then the top of the file, then the
// defaults. Throws BadInput.
Scenario resolve(const Settings& commandLine, std::optional<uint32_t> dchannels, const ScenarioFile* file);

// Reads a TOML file. Throws BadInput.
ScenarioFile readScenarioFile(const std::string& path);

}  // namespace softboard

#endif
