#include "fleet/ship/Place.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <nlohmann/json.hpp>
#include <stdexcept>

namespace fleet {

namespace {

using nlohmann::json;

constexpr unsigned version = 1;

}  // namespace

std::optional<Place> readPlace(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    if (!file && !std::filesystem::exists(path))
        return std::nullopt;
    try {
        if (!file)
            throw std::runtime_error("it cannot be opened");
        const json from = json::parse(file);
        if (from.at("v") != version)
            throw std::runtime_error("it is of another version");
        Place place;
        place.run = from.at("run").get<std::uint64_t>();
        place.next = std::max<std::uint64_t>(from.at("next").get<std::uint64_t>(), 1);
        place.isEnded = from.at("ended").get<bool>();
        if (!from.at("log").is_null())
            place.log = recording::logFromJson(from.at("log").dump());
        return place;
    } catch (const std::exception& error) {
        throw std::runtime_error(path + ": " + error.what());
    }
}

std::optional<std::string> writePlace(const Place& place, const std::string& dChannel,
                                      const std::string& path, recording::Durability durability) {
    return recording::replaceFile(
        path,
        "{\"v\":" + std::to_string(version) + ",\n\"dchannel\":" + json(dChannel).dump() +
            ",\n\"run\":" + std::to_string(place.run) + ",\n\"next\":" + std::to_string(place.next) +
            ",\n\"ended\":" + (place.isEnded ? "true" : "false") +
            ",\n\"log\":" + (place.log ? recording::toJson(*place.log) : "null") + "}\n",
        durability);
}

}  // namespace fleet
