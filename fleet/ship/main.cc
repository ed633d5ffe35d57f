#include <unistd.h>

#include <atomic>
#include <csignal>
#include <iostream>

#include "fleet/ship/ShipConfig.h"
#include "fleet/ship/Shipper.h"
#include "fleet/ship/command_line.h"
#include "fleet/streams.h"
#include "recording/files.h"
#include "service/notify.h"

namespace {

enum ExitStatus { good = 0, badUsage = 1, failed = 2 };

std::atomic<bool> shallStop{false};

void stop(int) { shallStop = true; }

// Without SA_RESTART, so that a signal ends every wait.
void watchSignals() {
    struct sigaction action {};
    action.sa_handler = stop;
    for (const int signal : {SIGTERM, SIGINT})
        sigaction(signal, &action, nullptr);
    action.sa_handler = SIG_IGN;
    sigaction(SIGPIPE, &action, nullptr);
}

void say(const std::string& text) { recording::writeAll(STDERR_FILENO, "lapdship: " + text + "\n"); }

void makeStreams(const fleet::ShipConfig& config, const std::vector<fleet::StreamRules>& streams) {
    fleet::NatsConnection connection(config.nats);
    for (const fleet::StreamRules& rules : streams) {
        makeStream(connection, rules);
        std::cout << "the stream " << rules.name << " is ready" << std::endl;
    }
}

void obey(const fleet::ShipCommand& command) {
    const fleet::ShipConfig config = fleet::readShipConfig(command.config, command.redact);
    if (command.what == fleet::ShipCommand::What::streams) {
        makeStreams(config, command.streams);
        return;
    }
    watchSignals();
    fleet::Shipper shipper(config, {}, say);
    service::notify("READY=1");
    if (command.what == fleet::ShipCommand::What::once)
        shipper.drain(shallStop);
    else
        shipper.run(shallStop);
    service::notify("STOPPING=1");
}

}  // namespace

int main(int argc, char** argv) {
    try {
        const fleet::ShipCommand command = fleet::parseShipCommand(argc, argv);
        if (command.told.empty())
            obey(command);
        else
            std::cout << command.told << std::flush;
        return good;
    } catch (const fleet::BadShipCommand& error) {
        say(error.what());
        return badUsage;
    } catch (const fleet::BadConfig& error) {
        say(error.what());
        return badUsage;
    } catch (const std::exception& error) {
        say(error.what());
        return failed;
    }
}
