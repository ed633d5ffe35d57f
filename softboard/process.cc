#include "softboard/process.h"

#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>
#include <mutex>
#include <sstream>

#include "softboard/handover.h"

namespace softboard {

namespace {

std::atomic<Network*> made = nullptr;

Scenario loadScenario() {
    const char* path = std::getenv(scenarioVariable);
    if (path == nullptr) {
        return builtinScenario();
    }
    try {
        const std::ifstream file(path);
        if (!file) {
            throw std::runtime_error(std::strerror(errno));
        }
        std::ostringstream text;
        text << file.rdbuf();
        return fromJson(text.str());
    } catch (const std::exception& error) {
        std::cerr << "softboard: " << scenarioVariable << "=" << path << ": " << error.what() << std::endl;
        std::abort();
    }
}

Network* make() {
    const Scenario scenario = loadScenario();
    auto* network = new Network(scenario);  // never deleted: it lives as long as the process
    if (!scenario.journal.empty() && !network->journal().writeTo(scenario.journal)) {
        std::cerr << "softboard: " << scenario.journal << ": " << std::strerror(errno) << std::endl;
    }
    made = network;
    return network;
}

// Runs after the program's own exit handlers and destructors. Writes the last line of the journal.
__attribute__((destructor)) void tearDown() {
    if (Network* network = made; network != nullptr) {
        network->shutDown();
        network->journal().note(network->balance());
    }
}

}  // namespace

void sayThatBoardsAreSimulated() {
    static std::once_flag said;
    if (std::getenv(scenarioVariable) != nullptr) {
        return;
    }
    std::call_once(said, [] {
        std::cerr << "softboard: this libnorv.so is the software board's: boards are simulated\n"
                  << std::flush;
    });
}

Network& network() {
    static Network& theNetwork = *make();
    return theNetwork;
}

}  // namespace softboard
