#include <limits>
#include <nlohmann/json.hpp>
#include <stdexcept>
#include <string>

#include "softboard/hex.h"
#include "softboard/scenario.h"

namespace softboard {

namespace {

using nlohmann::json;

// Paths are written in hexadecimal, because a path may contain octets that are not UTF-8 and JSON may not.
std::string pathToHex(const std::string& path) { return hex(std::vector<uint8_t>(path.begin(), path.end())); }

std::string pathFromHex(const std::string& text) {
    const std::vector<uint8_t> octets = fromHex(text);
    return {octets.begin(), octets.end()};
}

// Reads a whole number that the type can hold, and throws for any other value. (The JSON library would
// convert it.)
template <typename Number>
Number numberFrom(const json& from) {
    constexpr uint64_t most = std::numeric_limits<Number>::max();
    if (!from.is_number_unsigned() || from.get<uint64_t>() > most) {
        throw std::runtime_error("not a number from 0 to " + std::to_string(most) + ": " + from.dump());
    }
    return from.get<Number>();
}

json toJson(const Frame& frame) {
    return {{"transmitted", frame.transmitted}, {"ticks", frame.ticks}, {"octets", hex(frame.octets)}};
}

Frame frameFrom(const json& from) {
    return {from.at("transmitted"), numberFrom<uint32_t>(from.at("ticks")),
            fromHex(from.at("octets").get<std::string>())};
}

json toJson(const DChannel& channel) {
    return {{"board", channel.board},
            {"number", channel.number},
            {"protocol", channel.protocol},
            {"rate", static_cast<int>(channel.rate.kind)},
            {"perSecond", channel.rate.perSecond},
            {"loop", channel.loop},
            {"label", channel.label},
            {"capture", channel.capture}};
}

Rate rateFrom(const json& from) {
    const auto kind = static_cast<Rate::Kind>(numberFrom<uint8_t>(from.at("rate")));
    const double perSecond = from.at("perSecond");
    if (kind > Rate::Kind::max || (kind == Rate::Kind::perSecond && !Rate::isPossible(perSecond))) {
        throw std::runtime_error("a D channel has no possible rate");
    }
    return {kind, perSecond};
}

DChannel channelFrom(const json& from) {
    DChannel channel;
    channel.board = numberFrom<uint8_t>(from.at("board"));
    channel.number = numberFrom<uint16_t>(from.at("number"));
    channel.protocol = numberFrom<uint32_t>(from.at("protocol"));
    channel.rate = rateFrom(from);
    channel.loop = from.at("loop");
    channel.label = numberFrom<uint32_t>(from.at("label"));
    channel.capture = numberFrom<size_t>(from.at("capture"));
    return channel;
}

}  // namespace

std::string toJson(const Scenario& scenario) {
    json to{{"journal", pathToHex(scenario.journal)},
            {"channels", json::array()},
            {"captures", json::array()},
            {"faults", json::array()}};
    for (const DChannel& channel : scenario.channels) {
        to["channels"].push_back(toJson(channel));
    }
    for (const Fault& fault : scenario.faults) {
        to["faults"].push_back(toText(fault));
    }
    for (const Frames& frames : scenario.captures) {
        json& capture = to["captures"].emplace_back(json::array());
        for (const Frame& frame : frames) {
            capture.push_back(toJson(frame));
        }
    }
    return to.dump();
}

Scenario fromJson(const std::string& text) {
    const json from = json::parse(text);
    Scenario scenario;
    scenario.journal = pathFromHex(from.at("journal").get<std::string>());
    for (const json& fault : from.at("faults")) {
        scenario.faults.push_back(parseFault(fault.get<std::string>()));
    }
    for (const json& capture : from.at("captures")) {
        Frames& frames = scenario.captures.emplace_back();
        for (const json& frame : capture) {
            frames.push_back(frameFrom(frame));
        }
    }
    for (const json& channel : from.at("channels")) {
        scenario.channels.push_back(channelFrom(channel));
        if (scenario.channels.back().capture >= scenario.captures.size()) {
            throw std::runtime_error("a D channel plays a capture that is not there");
        }
    }
    return scenario;
}

}  // namespace softboard
