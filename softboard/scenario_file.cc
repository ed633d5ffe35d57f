#include <sys/stat.h>

#include <toml++/toml.h>
#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "softboard/settings.h"

namespace softboard {

namespace {

// Reads one table of the file. A key that nobody has asked for when the table ends is an error.
class TableReader {
  public:
    TableReader(const std::string& path, const toml::table& table) : path_(path), table_(table) {}

    std::string place(const toml::node& node) const {
        return path_ + ":" + std::to_string(node.source().begin.line);
    }

    std::optional<uint32_t> number(const char* key, uint32_t least, uint32_t most) {
        const toml::node* node = take(key);
        if (node == nullptr) {
            return std::nullopt;
        }
        const auto value = node->value_exact<int64_t>();
        if (!value || *value < least || *value > most) {
            fail(*node, key,
                 "must be a number from " + std::to_string(least) + " to " + std::to_string(most));
        }
        return static_cast<uint32_t>(*value);
    }

    std::optional<bool> flag(const char* key) {
        const toml::node* node = take(key);
        if (node == nullptr) {
            return std::nullopt;
        }
        if (!node->is_boolean()) {
            fail(*node, key, "must be true or false");
        }
        return node->value<bool>();
    }

    std::optional<std::string> text(const char* key) {
        const toml::node* node = take(key);
        if (node == nullptr) {
            return std::nullopt;
        }
        if (!node->is_string()) {
            fail(*node, key, "must be a text in quotes");
        }
        return node->value<std::string>();
    }

    // A path; a relative one is relative to the folder of the scenario file.
    std::optional<std::string> file(const char* key) {
        auto name = text(key);
        if (name) {
            *name = (std::filesystem::path(path_).parent_path() / *name).string();
        }
        return name;
    }

    std::optional<uint32_t> protocol(const char* key) {
        return parsed<uint32_t>(key, parseProtocol, [](const toml::node& node) -> std::optional<uint32_t> {
            const auto value = node.value_exact<int64_t>();
            return value && *value >= 0 && *value <= UINT32_MAX ? std::optional(static_cast<uint32_t>(*value))
                                                                : std::nullopt;
        });
    }

    std::optional<Rate> rate(const char* key) {
        return parsed<Rate>(key, parseRate, [](const toml::node& node) -> std::optional<Rate> {
            return node.is_number() ? std::optional(framesPerSecond(*node.value<double>())) : std::nullopt;
        });
    }

    std::vector<Fault> faults(const char* key) {
        const toml::node* node = take(key);
        if (node == nullptr) {
            return {};
        }
        if (!node->is_array()) {
            fail(*node, key, "must be a list of texts in quotes");
        }
        std::vector<Fault> faults;
        for (const toml::node& each : *node->as_array()) {
            if (!each.is_string()) {
                fail(each, key, "must be a list of texts in quotes");
            }
            try {
                faults.push_back(parseFaultSetting(*each.value<std::string>()));
            } catch (const BadInput& error) {
                fail(each, key, error.what());
            }
        }
        return faults;
    }

    const toml::array* tables(const char* key) {
        const toml::node* node = take(key);
        if (node == nullptr) {
            return nullptr;
        }
        if (!node->is_array_of_tables()) {
            fail(*node, key, "must be written as [[" + std::string(key) + "]]");
        }
        return node->as_array();
    }

    void end() const {
        for (const auto& [key, node] : table_) {
            if (std::find(taken_.begin(), taken_.end(), key.str()) == taken_.end()) {
                fail(node, std::string(key.str()), "is not a setting");
            }
        }
    }

  private:
    const toml::node* take(const char* key) {
        taken_.emplace_back(key);
        return table_.get(key);
    }

    template <class T, class FromText, class FromNode>
    std::optional<T> parsed(const char* key, FromText fromText, FromNode fromNode) {
        const toml::node* node = take(key);
        if (node == nullptr) {
            return std::nullopt;
        }
        try {
            const auto value =
                node->is_string() ? std::optional<T>(fromText(*node->value<std::string>())) : fromNode(*node);
            if (value) {
                return value;
            }
        } catch (const BadInput& error) {
            fail(*node, key, error.what());
        }
        fail(*node, key, "must be a name or a number");
    }

    [[noreturn]] void fail(const toml::node& node, const std::string& key, const std::string& reason) const {
        throw BadInput(place(node) + ": " + key + ": " + reason);
    }

    std::string path_;
    const toml::table& table_;
    std::vector<std::string> taken_;
};

toml::table parse(const std::string& path) {
    struct stat status {};
    std::ifstream file(path);
    if (!file || ::stat(path.c_str(), &status) != 0) {
        throw BadInput(path + ": " + std::strerror(errno));
    }
    if (S_ISDIR(status.st_mode)) {
        throw BadInput(path + ": " + std::strerror(EISDIR));
    }
    try {
        return toml::parse(file, path);
    } catch (const toml::parse_error& error) {
        const auto& at = error.source().begin;
        throw BadInput(path + ":" + std::to_string(at.line) + ":" + std::to_string(at.column) + ": " +
                       std::string(error.description()));
    }
}

Settings readSettings(TableReader& table) {
    Settings settings;
    settings.frames = table.file("frames");
    settings.protocol = table.protocol("protocol");
    settings.rate = table.rate("rate");
    settings.loop = table.flag("loop");
    settings.board = table.number("board", 0, largestBoard);
    settings.label = table.number("label", 0, UINT32_MAX);
    return settings;
}

ChannelSettings readChannel(const std::string& path, const toml::table& from) {
    TableReader table(path, from);
    ChannelSettings channel;
    channel.place = table.place(from);
    channel.number = table.number("number", 1, UINT16_MAX);
    channel.settings = readSettings(table);
    table.end();
    return channel;
}

}  // namespace

ScenarioFile readScenarioFile(const std::string& path) {
    const toml::table from = parse(path);
    TableReader table(path, from);
    ScenarioFile file;
    file.path = path;
    file.settings = readSettings(table);
    file.dchannels = table.number("dchannels", 1, mostDChannels);
    file.journal = table.file("journal");
    file.faults = table.faults("faults");
    if (const toml::array* channels = table.tables("dchannel"); channels != nullptr) {
        for (const toml::node& channel : *channels) {
            file.channels.push_back(readChannel(path, *channel.as_table()));
        }
    }
    table.end();
    return file;
}

}  // namespace softboard
