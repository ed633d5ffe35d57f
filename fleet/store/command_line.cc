#include "fleet/store/command_line.h"

#include <CLI/CLI.hpp>

#include "fleet/metrics/HttpAnswerer.h"
#include "fleet/subjects.h"

namespace fleet {

namespace {

constexpr const char* about =
    "Keeps the frames of a fleet in PostgreSQL, with the calls and findings they make.";

constexpr const char* footer =
    "Several may run: each partition of the stream is leased to one of them, and taken over when that one "
    "ends.\n"
    "A password for the database comes from where libpq takes it (~/.pgpass, PGPASSWORD). It ends on SIGTERM "
    "and SIGINT.\n";

struct Commands {
    CLI::App* migrate = nullptr;
    CLI::App* forget = nullptr;
    CLI::App* rewind = nullptr;
};

Commands describe(CLI::App& app, StoreCommand& to) {
    app.footer(footer);
    app.set_help_flag("--help,-h", "Print this and exit");
    app.set_version_flag("--version", "lapdstore " LAPDSTORE_VERSION, "Print the version and exit");
    app.add_option("--database", to.database,
                   "The database: postgresql://USER@HOST/lapd; only rewind needs none")
        ->type_name("URL");
    app.add_option("--nats", to.nats.servers, "A server of NATS: tls://HOST:4222; may be given several times")
        ->type_name("URL")
        ->allow_extra_args(false);
    app.add_option("--authority", to.nats.authority, "Certificates of who signs the servers'")
        ->type_name("FILE");
    app.add_option("--certificate", to.nats.certificate, "Our own certificate")->type_name("FILE");
    app.add_option("--key", to.nats.key, "The certificate's key")->type_name("FILE");
    app.add_option("--threads", to.threads, "Work in N threads, 1 to 64 (default: 2)")
        ->type_name("N")
        ->check(CLI::Range(1, 64).description(""));
    app.add_option("--first", to.firstPartition, "Partitions from this one on (default: 0)")
        ->type_name("N")
        ->check(CLI::Range(0U, partitions - 1).description(""));
    app.add_option("--last", to.lastPartition, "... up to this one (default: 63)")
        ->type_name("N")
        ->check(CLI::Range(0U, partitions - 1).description(""));
    app.add_option("--again-after", to.againAfter,
                   "What a lapdstore that died had fetched comes again after so many seconds, 1 to 3600 "
                   "(default: 30)")
        ->type_name("N")
        ->check(CLI::Range(1, 3600).description(""));
    app.add_option("--metrics", to.metrics,
                   "Offer figures for Prometheus at http://ADDR:PORT/metrics; a port alone is on 127.0.0.1 "
                   "(default: nowhere)")
        ->type_name("[ADDR:]PORT");
    Commands commands;
    commands.migrate = app.add_subcommand("migrate", "Makes the tables, or brings them up to date, and ends");
    commands.forget = app.add_subcommand("forget", "Forgets what is older than some days, and ends");
    commands.forget->add_option("--days", to.days, "How many days stay, 1 to 36500")
        ->type_name("N")
        ->required()
        ->check(CLI::Range(1, 36'500).description(""));
    commands.rewind = app.add_subcommand(
        "rewind", "Lets the stream deliver again what it still has of the partitions, and ends");
    for (CLI::App* const each : {commands.migrate, commands.forget, commands.rewind})
        each->fallthrough();
    app.require_subcommand(0, 1);
    return commands;
}

// What stores needs both engines; the other commands need one each.
void requireEngines(const StoreCommand& command) {
    using What = StoreCommand::What;
    if (command.what != What::rewind && command.database.empty())
        throw BadStoreCommand("--database is required (--help tells more)");
    const bool isOnStream = command.what == What::run || command.what == What::rewind;
    if (isOnStream && command.nats.servers.empty())
        throw BadStoreCommand("--nats names no server (--help tells more)");
}

}  // namespace

StoreCommand parseStoreCommand(int argc, const char* const* argv) {
    StoreCommand command;
    CLI::App app(about, "lapdstore");
    const Commands commands = describe(app, command);
    try {
        app.parse(argc, argv);
    } catch (const CLI::CallForHelp&) {
        command.told = app.help();
        return command;
    } catch (const CLI::CallForVersion& version) {
        command.told = std::string(version.what()) + "\n";
        return command;
    } catch (const CLI::ParseError& error) {
        throw BadStoreCommand(std::string(error.what()) + " (--help tells more)");
    }
    if (commands.migrate->parsed())
        command.what = StoreCommand::What::migrate;
    if (commands.forget->parsed())
        command.what = StoreCommand::What::forget;
    if (commands.rewind->parsed())
        command.what = StoreCommand::What::rewind;
    requireEngines(command);
    if (!command.metrics.empty() && !isListenAddress(command.metrics))
        throw BadStoreCommand("--metrics " + command.metrics +
                              " is no address to listen on, such as 127.0.0.1:9471");
    if (command.firstPartition > command.lastPartition)
        throw BadStoreCommand("--first is behind --last");
    return command;
}

void showStoreDescription(const std::function<void(const CLI::App&)>& visit) {
    StoreCommand command;
    CLI::App app(about, "lapdstore");
    describe(app, command);
    visit(app);
}

}  // namespace fleet
