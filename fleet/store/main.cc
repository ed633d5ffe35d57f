#include <atomic>
#include <csignal>
#include <iostream>
#include <mutex>
#include <optional>
#include <pqxx/pqxx>
#include <thread>
#include <vector>

#include "fleet/metrics/HttpAnswerer.h"
#include "fleet/store/Migrations.h"
#include "fleet/store/NatsInbox.h"
#include "fleet/store/Worker.h"
#include "fleet/store/command_line.h"
#include "service/notify.h"

namespace {

enum ExitStatus { good = 0, badUsage = 1, failed = 2 };

std::atomic<bool> stopped{false};

// A second signal kills.
void stopOnSignals() {
    struct sigaction action {};
    action.sa_handler = [](int) { stopped = true; };
    action.sa_flags = static_cast<int>(SA_RESETHAND);
    for (const int signal : {SIGTERM, SIGINT})
        sigaction(signal, &action, nullptr);
    action.sa_handler = SIG_IGN;
    sigaction(SIGPIPE, &action, nullptr);
}

// A line at a time, whichever thread says it.
void say(const std::string& line) {
    static std::mutex one;
    const std::lock_guard guard(one);
    std::cerr << "lapdstore: " << line << std::endl;
}

void migrate(const fleet::StoreCommand& command) {
    pqxx::connection connection(command.database);
    const auto done = fleet::migrate(connection);
    for (const std::string_view name : done)
        std::cout << "applied " << name << "\n";
    if (done.empty())
        std::cout << "nothing to do\n";
}

void forget(const fleet::StoreCommand& command) {
    pqxx::connection connection(command.database);
    pqxx::work work(connection);
    const pqxx::row row = work.exec_params1(
        "SELECT lapd.forget_before((now() AT TIME ZONE 'UTC')::date - $1::integer)", command.days);
    work.commit();
    std::cout << "days forgotten: " << row[0].c_str() << "\n";
}

void rewind(const fleet::StoreCommand& command) {
    fleet::NatsOptions options = command.nats;
    options.name = "lapdstore rewind";
    fleet::NatsConnection connection(options);
    unsigned rewound = 0;
    for (unsigned partition = command.firstPartition; partition <= command.lastPartition; ++partition)
        rewound += fleet::rewind(connection, partition) ? 1 : 0;
    std::cout << "partitions that the stream delivers again: " << rewound << "\n";
}

void run(const fleet::StoreCommand& command) {
    stopOnSignals();
    fleet::StoreFigures figures;
    std::optional<fleet::HttpAnswerer> answerer;
    if (!command.metrics.empty()) {
        answerer.emplace(command.metrics, [&] { return figures.text(); });
        say("figures are at http://" + answerer->address() + "/metrics");
    }
    std::vector<fleet::WorkerOptions> shares(command.threads);
    for (unsigned partition = command.firstPartition; partition <= command.lastPartition; ++partition)
        shares[partition % command.threads].partitions.push_back(partition);
    std::vector<std::jthread> threads;
    for (fleet::WorkerOptions& share : shares) {
        share.database = command.database;
        share.nats = command.nats;
        share.nats.name = "lapdstore";
        share.againAfter = std::chrono::seconds(command.againAfter);
        share.figures = &figures;
        share.number = static_cast<unsigned>(&share - shares.data());
        if (!share.partitions.empty())
            threads.emplace_back([&share] { fleet::work(share, stopped, say); });
    }
    service::notify("READY=1");
    for (std::jthread& each : threads)
        each.join();
    service::notify("STOPPING=1");
}

void obey(const fleet::StoreCommand& command) {
    switch (command.what) {
        case fleet::StoreCommand::What::run:
            return run(command);
        case fleet::StoreCommand::What::migrate:
            return migrate(command);
        case fleet::StoreCommand::What::forget:
            return forget(command);
        case fleet::StoreCommand::What::rewind:
            return rewind(command);
    }
}

}  // namespace

int main(int argc, char** argv) {
    try {
        const fleet::StoreCommand command = fleet::parseStoreCommand(argc, argv);
        if (command.told.empty())
            obey(command);
        else
            std::cout << command.told << std::flush;
        return good;
    } catch (const fleet::BadStoreCommand& error) {
        say(error.what());
        return badUsage;
    } catch (const std::exception& error) {
        say(error.what());
        return failed;
    }
}
