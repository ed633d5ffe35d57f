#include "softboard/settings.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <map>
#include <set>

#include "softboard/capture.h"

namespace softboard {

namespace {

const std::map<std::string, uint32_t> protocolNames = {
    {"4ess", att4ess}, {"5ess", att5ess}, {"dms100", dms100}, {"ntt", ntt}, {"net5", net5}, {"ni2", ni2},
};

template <class T>
std::optional<T> parseNumber(const std::string& text) {
    T value{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (error != std::errc{} || end != text.data() + text.size()) {
        return std::nullopt;
    }
    return value;
}

// Adds captures to a scenario. A capture that several D channels play is read once.
class Captures {
  public:
    explicit Captures(Scenario& scenario) : scenario_(scenario) {}

    // The index of the capture in the scenario; without a path, of the built-in capture.
    size_t indexOf(const std::optional<std::string>& path) {
        const auto [known, isNew] = known_.try_emplace(path, scenario_.captures.size());
        if (isNew) {
            scenario_.captures.push_back(path ? readCapture(*path) : builtinFrames());
        }
        return known->second;
    }

  private:
    Scenario& scenario_;
    std::map<std::optional<std::string>, size_t> known_;
};

DChannel makeChannel(const Settings& settings, uint16_t number, Captures& captures) {
    DChannel channel;
    channel.board = static_cast<uint8_t>(settings.board.value_or(channel.board));
    channel.number = number;
    channel.protocol = settings.protocol.value_or(channel.protocol);
    channel.rate = settings.rate.value_or(channel.rate);
    const bool builtin = !settings.frames;
    channel.loop = settings.loop.value_or(builtin && channel.rate.kind == Rate::Kind::recorded);
    channel.label = settings.label.value_or(channel.label);
    channel.capture = captures.indexOf(settings.frames);
    return channel;
}

void addNumbered(Scenario& scenario, Captures& captures, const Settings& settings, uint32_t count) {
    for (uint32_t number = 1; number <= count; ++number) {
        scenario.channels.push_back(makeChannel(settings, static_cast<uint16_t>(number), captures));
    }
}

void addListed(Scenario& scenario, Captures& captures, const Settings& base, const ScenarioFile& file) {
    std::set<std::pair<uint8_t, uint16_t>> taken;
    uint32_t next = 1;
    for (const ChannelSettings& listed : file.channels) {
        const uint32_t number = listed.number.value_or(next);
        next = number + 1;
        const DChannel channel =
            makeChannel(listed.settings.over(base), static_cast<uint16_t>(number), captures);
        if (!taken.insert({channel.board, channel.number}).second) {
            throw BadInput(listed.place + ": board " + std::to_string(channel.board) + " has D channel " +
                           std::to_string(number) + " already");
        }
        scenario.channels.push_back(channel);
    }
}

}  // namespace

Settings Settings::over(const Settings& base) const {
    Settings all = *this;
    const auto fill = [](auto& value, const auto& from) { value = value ? value : from; };
    fill(all.frames, base.frames);
    fill(all.protocol, base.protocol);
    fill(all.rate, base.rate);
    fill(all.loop, base.loop);
    fill(all.board, base.board);
    fill(all.label, base.label);
    return all;
}

uint32_t parseProtocol(const std::string& text) {
    if (const auto named = protocolNames.find(text); named != protocolNames.end()) {
        return named->second;
    }
    if (const auto number = parseNumber<uint32_t>(text); number) {
        return *number;
    }
    throw BadInput("\"" + text + "\" is none of 4ess, 5ess, dms100, ntt, net5, ni2 and no number");
}

Rate framesPerSecond(double rate) {
    if (!Rate::isPossible(rate)) {
        throw BadInput("frames per second must be at least 0.000001 and at most 1000000");
    }
    return {Rate::Kind::perSecond, rate};
}

Rate parseRate(const std::string& text) {
    if (text == "recorded") {
        return {Rate::Kind::recorded, 0};
    }
    if (text == "max") {
        return {Rate::Kind::max, 0};
    }
    const auto number = parseNumber<double>(text);
    if (!number) {
        throw BadInput("\"" + text + "\" is neither recorded, max nor a number of frames per second");
    }
    return framesPerSecond(*number);
}

Fault parseFaultSetting(const std::string& text) {
    try {
        return parseFault(text);
    } catch (const std::invalid_argument& error) {
        throw BadInput(error.what());
    }
}

uint32_t parseNumberIn(const std::string& text, uint32_t least, uint32_t most) {
    const auto number = parseNumber<uint32_t>(text);
    if (!number || *number < least || *number > most) {
        throw BadInput("\"" + text + "\" is no number from " + std::to_string(least) + " to " +
                       std::to_string(most));
    }
    return *number;
}

Scenario resolve(const Settings& commandLine, std::optional<uint32_t> dchannels, const ScenarioFile* file) {
    const Settings base = file == nullptr ? commandLine : commandLine.over(file->settings);
    Scenario scenario;
    Captures captures(scenario);
    if (file == nullptr || file->channels.empty()) {
        const auto count = dchannels ? dchannels : file == nullptr ? std::nullopt : file->dchannels;
        addNumbered(scenario, captures, base, count.value_or(1));
    } else if (dchannels || file->dchannels) {
        throw BadInput(file->path +
                       ": it lists its D channels one by one; dchannels cannot be given as well");
    } else {
        addListed(scenario, captures, base, *file);
    }
    if (file != nullptr) {
        scenario.journal = file->journal.value_or("");
        scenario.faults = file->faults;
    }
    return scenario;
}

}  // namespace softboard
