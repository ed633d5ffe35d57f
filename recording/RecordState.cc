#include "recording/RecordState.h"

#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <limits>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "recording/files.h"

namespace recording {

namespace {

using nlohmann::json;

constexpr unsigned version = 1;

std::string hexOf(std::span<const std::uint8_t> octets) {
    constexpr std::string_view digits = "0123456789abcdef";
    std::string hex;
    for (const std::uint8_t octet : octets) {
        hex += digits[octet >> 4U];
        hex += digits[octet & 15U];
    }
    return hex;
}

// Reads an integer. The JSON library itself would convert other values, such as a fraction.
template <class Number>
Number numberIn(const json& from) {
    const bool isSigned = std::numeric_limits<Number>::is_signed;
    if (!(isSigned ? from.is_number_integer() : from.is_number_unsigned()))
        throw std::runtime_error("no whole number: " + from.dump());
    const auto number = from.get<std::conditional_t<isSigned, std::int64_t, std::uint64_t>>();
    if (number > std::numeric_limits<Number>::max())
        throw std::runtime_error("too large: " + from.dump());
    return static_cast<Number>(number);
}

// Names are octets to the system; those that are no UTF-8 are replaced.
std::string textOf(const json& value) { return value.dump(-1, ' ', false, json::error_handler_t::replace); }

json jsonOf(const RecordedLog& log) {
    return {
        {"path", log.path},
        {"device", log.device},
        {"inode", log.inode},
        {"first", {{"time", log.time}, {"ticks", log.ticks ? json(*log.ticks) : json()}, {"hex", log.hex}}}};
}

RecordedLog logFrom(const json& from) {
    const json& first = from.at("first");
    RecordedLog log{from.at("path"),
                    numberIn<std::uint64_t>(from.at("device")),
                    numberIn<std::uint64_t>(from.at("inode")),
                    numberIn<std::int64_t>(first.at("time")),
                    std::nullopt,
                    first.at("hex")};
    if (!first.at("ticks").is_null())
        log.ticks = numberIn<std::uint32_t>(first.at("ticks"));
    return log;
}

RecordState stateFrom(const json& from) {
    if (numberIn<unsigned>(from.at("v")) != version)
        throw std::runtime_error("it is of another version: " + from.at("v").dump());
    RecordState state;
    state.trunk = from.at("trunk");
    state.run = numberIn<std::uint64_t>(from.at("run"));
    state.next = std::max<std::uint64_t>(numberIn<std::uint64_t>(from.at("next")), 1);
    state.besides = numberIn<std::uint64_t>(from.at("besides"));
    if (!from.at("log").is_null())
        state.log = logFrom(from.at("log"));
    for (const json& file : from.at("files"))
        state.files.push_back({file.at("name"), numberIn<std::uint64_t>(file.at("run")),
                               numberIn<std::uint64_t>(file.at("first"))});
    return state;
}

// The state as text, with one file a line, so that people and shell scripts can read it.
std::string textOf(const RecordState& state) {
    std::string all = "{\"v\":" + std::to_string(version) + ",\n\"trunk\":" + textOf(state.trunk) +
                      ",\n\"run\":" + std::to_string(state.run) +
                      ",\n\"next\":" + std::to_string(state.next) +
                      ",\n\"besides\":" + std::to_string(state.besides) +
                      ",\n\"log\":" + (state.log ? textOf(jsonOf(*state.log)) : "null") + ",\n\"files\":[";
    std::string_view separator = "\n";
    for (const RecordedFile& file : state.files) {
        all += separator;
        all += "{\"name\":" + textOf(file.name) + ",\"run\":" + std::to_string(file.run) +
               ",\"first\":" + std::to_string(file.first) + "}";
        separator = ",\n";
    }
    return all + "\n]}\n";
}

}  // namespace

std::optional<RecordedLog> logOf(const capture::Frame& first) {
    const std::string path(first.place.file);
    struct stat status {};
    if (path == "-" || stat(path.c_str(), &status) != 0 || !S_ISREG(status.st_mode))
        return std::nullopt;
    return RecordedLog{path, status.st_dev, status.st_ino, first.time, first.ticks, hexOf(first.octets)};
}

std::string toJson(const RecordedLog& log) { return textOf(jsonOf(log)); }

RecordedLog logFromJson(std::string_view text) {
    try {
        return logFrom(json::parse(text));
    } catch (const json::exception& error) {
        throw std::runtime_error(error.what());
    }
}

std::string statePath(const std::string& folder, const std::string& trunk) {
    return folder + "/" + trunk + ".state.json";
}

std::optional<RecordState> readState(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    if (!file && !std::filesystem::exists(path))
        return std::nullopt;
    try {
        if (!file)
            throw std::runtime_error(std::strerror(errno));
        return stateFrom(json::parse(file));
    } catch (const std::exception& error) {
        throw std::runtime_error(path + ": " + error.what());
    }
}

std::optional<std::string> writeState(const RecordState& state, const std::string& path) {
    return replaceFile(path, textOf(state));
}

void beginRun(RecordState& state, std::optional<RecordedLog> log) {
    const auto now = std::chrono::system_clock::now().time_since_epoch();
    const auto micros = std::chrono::duration_cast<std::chrono::microseconds>(now).count();
    state.run =
        std::max<std::uint64_t>(static_cast<std::uint64_t>(std::max<std::int64_t>(micros, 1)), state.run + 1);
    state.next = 1;
    state.besides = 0;
    state.log = std::move(log);
}

}  // namespace recording
