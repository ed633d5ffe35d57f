#include "fleet/ship/command_line.h"

#include <CLI/CLI.hpp>

#include "fleet/subjects.h"

namespace fleet {

namespace {

constexpr const char* about = "Ships the frames of this host's D channels to the stream of its site.";

constexpr const char* footer =
    "Each frame arrives and counts once, whatever is killed on the way: lapdship keeps its place on disk, "
    "sends\n"
    "again what may not have arrived, and the store drops what it has already. It ends on SIGTERM and "
    "SIGINT.\n";

enum class Kind : std::uint8_t { site, centre };

struct Given {
    bool isOnce = false;
    Kind kind = Kind::site;
    std::uint32_t replicas = 1;
    std::uint64_t megabytes = 0;
    std::uint32_t days = 7;
    std::vector<std::string> sites;
};

CLI::App* describe(CLI::App& app, Given& given, ShipCommand& command) {
    app.footer(footer);
    app.add_option("--config,-c", command.config, "Configuration file (default: /etc/lapdship.toml)")
        ->type_name("FILE");
    app.add_option("--redact", command.redact,
                   "Send pseudonyms in place of numbers, made with this key; lapdread redact makes keys")
        ->type_name("KEYFILE");
    app.add_flag("--once", given.isOnce, "Ship what is there, and end");
    app.set_help_flag("--help,-h", "Print this and exit");
    app.set_version_flag("--version", "lapdship " LAPDSHIP_VERSION, "Print the version and exit");

    CLI::App* const streams = app.add_subcommand(
        "streams", "Makes the streams of a site or of the centre, or gives them other rules, and ends");
    streams->fallthrough();
    const std::map<std::string, Kind> kinds{{"site", Kind::site}, {"centre", Kind::centre}};
    streams->add_option("kind", given.kind, "site or centre")
        ->required()
        ->type_name("site|centre")
        ->transform(CLI::CheckedTransformer(kinds, CLI::ignore_case).description(""));
    streams
        ->add_option("--replicas", given.replicas, "Copies, 1 to 5, each on a server of its own (default: 1)")
        ->type_name("N")
        ->check(CLI::Range(1, 5).description(""));
    streams
        ->add_option(
            "--size", given.megabytes,
            "Most megabytes on each server's disk; a full stream takes no more, and frames wait in their "
            "recordings (default: as much as the server allows)")
        ->type_name("MB")
        ->check(CLI::Range(std::uint64_t{0}, std::uint64_t{100'000'000}).description(""));
    streams->add_option("--days", given.days, "How long frames stay, 1 to 3650 (default: 7)")
        ->type_name("N")
        ->check(CLI::Range(1, 3650).description(""));
    streams
        ->add_option("--from", given.sites,
                     "Of the centre: the JetStream domain of a site whose frames are fetched; may be given "
                     "several times")
        ->type_name("DOMAIN")
        ->allow_extra_args(false);
    return streams;
}

// A server that was started anew remembers other ids than its neighbours. With nats-server 2.9 a message that
// only some of them know would then be in some copies of the stream and not in others, and all messages
// behind it would have another number there. So the servers of a stream with copies remember ids for the
// shortest time that they accept; the store drops what comes twice.
constexpr std::chrono::milliseconds shortestMemory{100};

StreamRules rulesOf(const Given& given, const char* name) {
    StreamRules rules;
    rules.name = name;
    rules.replicas = given.replicas;
    rules.mostOctets = given.megabytes * 1'000'000;
    rules.age = std::chrono::hours(24) * given.days;
    if (given.replicas > 1)
        rules.duplicates = shortestMemory;
    return rules;
}

std::vector<StreamRules> streamsOf(const Given& given) {
    if (given.kind == Kind::site) {
        if (!given.sites.empty())
            throw BadShipCommand("--from is for the centre");
        StreamRules site = rulesOf(given, siteStream);
        site.subjects = {everySubject};
        return {site};
    }
    StreamRules centre = rulesOf(given, centreStream);
    // If sites are named, the centre fetches their streams. Otherwise shippers publish to the centre
    // directly.
    if (given.sites.empty())
        centre.subjects = {everySubject};
    centre.sites = given.sites;
    StreamRules dead = rulesOf(given, deadStream);
    dead.subjects = {everyDeadSubject};
    return {centre, dead};
}

}  // namespace

ShipCommand parseShipCommand(int argc, const char* const* argv) {
    ShipCommand command;
    command.config = "/etc/lapdship.toml";
    Given given;
    CLI::App app(about, "lapdship");
    const CLI::App* const streams = describe(app, given, command);
    try {
        app.parse(argc, argv);
    } catch (const CLI::CallForHelp&) {
        command.told = app.help();
    } catch (const CLI::CallForVersion& version) {
        command.told = std::string(version.what()) + "\n";
    } catch (const CLI::ParseError& error) {
        throw BadShipCommand(std::string(error.what()) + " (--help tells more)");
    }
    if (given.isOnce)
        command.what = ShipCommand::What::once;
    if (streams->parsed() && command.told.empty()) {
        command.what = ShipCommand::What::streams;
        command.streams = streamsOf(given);
    }
    return command;
}

void showShipDescription(const std::function<void(const CLI::App&)>& visit) {
    Given given;
    ShipCommand command;
    CLI::App app(about, "lapdship");
    describe(app, given, command);
    visit(app);
}

}  // namespace fleet
