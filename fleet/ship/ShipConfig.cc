#include "fleet/ship/ShipConfig.h"

#include <toml++/toml.h>
#include <unistd.h>

#include <filesystem>
#include <set>
#include <string_view>

#include "fleet/metrics/HttpAnswerer.h"

namespace fleet {

namespace {

constexpr unsigned longestWindow = 3600;  // seconds

// Reads a table of the file, key by key. end() refuses keys that were not read.
class Table {
  public:
    Table(const std::string& path, const toml::table& table) : path_(path), table_(table) {}

    std::optional<std::string> text(std::string_view key) {
        const toml::node* const node = take(key);
        if (node == nullptr)
            return std::nullopt;
        if (!node->is_string() || node->as_string()->get().empty())
            fail(*node, key, "must be a text in quotes");
        return node->as_string()->get();
    }

    std::string needed(std::string_view key) {
        if (auto found = text(key))
            return *std::move(found);
        fail(table_, key, "is missing");
    }

    std::string name(std::string_view key, const std::string& otherwise) {
        std::string name = text(key).value_or(otherwise);
        if (!isName(name))
            fail(table_, key, "must be 1 to 64 printable ASCII characters");
        return name;
    }

    std::string file(std::string_view key) {
        const auto found = text(key);
        return found ? (std::filesystem::path(path_).parent_path() / *found).string() : std::string();
    }

    std::vector<std::string> texts(std::string_view key) {
        std::vector<std::string> all;
        const toml::node* const node = take(key);
        if (node == nullptr || !node->is_array())
            fail(node == nullptr ? table_ : *node, key, "must be a list of texts");
        for (const toml::node& each : *node->as_array()) {
            if (!each.is_string())
                fail(each, key, "must be a list of texts");
            all.push_back(each.as_string()->get());
        }
        return all;
    }

    unsigned number(std::string_view key, unsigned most, unsigned otherwise) {
        const toml::node* const node = take(key);
        if (node == nullptr)
            return otherwise;
        const auto value = node->value_exact<std::int64_t>();
        if (!value || *value < 0 || *value > most)
            fail(*node, key, "must be a number from 0 to " + std::to_string(most));
        return static_cast<unsigned>(*value);
    }

    // The table of this name; an empty one if there is none.
    Table table(std::string_view key) {
        static const toml::table none;
        const toml::node* const node = take(key);
        if (node != nullptr && !node->is_table())
            fail(*node, key, "must be a table");
        return {path_, node == nullptr ? none : *node->as_table()};
    }

    std::vector<Table> tables(std::string_view key) {
        std::vector<Table> all;
        const toml::node* const node = take(key);
        if (node == nullptr || !node->is_array_of_tables())
            fail(node == nullptr ? table_ : *node, key, "must stand there, as [[" + std::string(key) + "]]");
        for (const toml::node& each : *node->as_array())
            all.emplace_back(path_, *each.as_table());
        return all;
    }

    // Refuses keys that were not read, because they are spelt wrong.
    void end() const {
        for (const auto& [key, node] : table_) {
            if (taken_.find(std::string(key.str())) == taken_.end())
                fail(node, key.str(), "is not known");
        }
    }

    [[noreturn]] void fail(const toml::node& node, std::string_view key, const std::string& what) const {
        throw BadConfig(path_ + ":" + std::to_string(node.source().begin.line) + ": " + std::string(key) +
                        " " + what);
    }
    [[noreturn]] void fail(std::string_view key, const std::string& what) const { fail(table_, key, what); }

  private:
    const toml::node* take(std::string_view key) {
        taken_.emplace(key);
        return table_.get(key);
    }

    std::string path_;
    const toml::table& table_;
    std::set<std::string> taken_;
};

std::string hostName() {
    char name[65]{};
    return gethostname(name, sizeof name - 1) == 0 ? std::string(name) : std::string();
}

void readTls(Table tls, NatsOptions& to) {
    to.authority = tls.file("authority");
    to.certificate = tls.file("certificate");
    to.key = tls.file("key");
    if (to.certificate.empty() != to.key.empty() || (to.authority.empty() && !to.certificate.empty()))
        tls.fail("tls", "must have authority, and certificate and key together");
    tls.end();
}

ShippedDChannel readDChannel(Table from, const std::string& site, const std::string& host) {
    ShippedDChannel to;
    to.head.address = {site, host, from.name("board", ""), from.name("dchannel", "")};
    to.head.trunk = from.needed("trunk");
    to.head.group = from.text("group").value_or("");
    if (!to.head.group.empty() && !isName(to.head.group))
        from.fail("group", "must be 1 to 64 printable ASCII characters");
    to.folder = from.file("folder");
    to.log = from.file("log");
    from.end();
    if (to.folder.empty() == to.log.empty())
        from.fail("dchannel", "must have either folder or log");
    return to;
}

}  // namespace

ShipConfig readShipConfig(const std::string& path, const std::string& redact) {
    toml::table all;
    try {
        all = toml::parse_file(path);
    } catch (const toml::parse_error& error) {
        throw BadConfig(path + ":" + std::to_string(error.source().begin.line) + ": " +
                        std::string(error.description()));
    }
    Table table(path, all);
    ShipConfig config;
    const std::string site = table.name("site", "");
    const std::string host = table.name("host", hostName());
    config.nats.servers = table.texts("servers");
    config.nats.name = "lapdship " + site + "/" + host;
    config.stream = table.text("stream").value_or(config.stream);
    config.state = table.file("state");
    if (config.nats.servers.empty() || config.state.empty())
        table.fail("servers and state", "must be given");
    if (const std::string key = table.file("redact"); !key.empty())
        config.redact = key;
    if (!redact.empty())
        config.redact = redact;
    config.leastFree = table.number("least_free", 100, config.leastFree);
    config.resendWindow = std::chrono::seconds(
        table.number("resend_window", longestWindow, static_cast<unsigned>(config.resendWindow.count())));
    config.metrics = table.text("metrics").value_or("");
    if (!config.metrics.empty() && !isListenAddress(config.metrics))
        table.fail("metrics", "must be an address to listen on, such as \"127.0.0.1:9470\"");
    readTls(table.table("tls"), config.nats);
    std::set<Address> known;
    for (Table& each : table.tables("dchannel")) {
        config.dChannels.push_back(readDChannel(each, site, host));
        ShippedDChannel& read = config.dChannels.back();
        read.head.isRedacted = config.redact.has_value();
        if (!known.insert(read.head.address).second)
            each.fail("dchannel", toText(read.head.address) + " stands there twice");
    }
    table.end();
    return config;
}

}  // namespace fleet
