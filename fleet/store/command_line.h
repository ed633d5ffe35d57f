// The command line of lapdstore.
#ifndef FLEET_STORE_COMMAND_LINE_H
#define FLEET_STORE_COMMAND_LINE_H

#include <functional>
#include <stdexcept>
#include <string>

#include "fleet/Nats.h"

namespace CLI {
class App;
}

namespace fleet {

// A command line that cannot be obeyed.
class BadStoreCommand : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct StoreCommand {
    enum class What : std::uint8_t {
        run,      // stores parcels until a signal ends it
        migrate,  // makes the tables, or brings them up to date
        forget,   // deletes what is older than `days`
        rewind    // lets the stream deliver the partitions again; has no database
    };

    std::string told;  // if not empty: the text of --help or --version, to be printed before the program ends
    What what = What::run;
    std::string database;
    NatsOptions nats;
    unsigned threads = 2;
    unsigned firstPartition = 0;
    unsigned lastPartition = 63;
    std::string metrics;       // the address at which figures are offered; empty: nowhere
    unsigned againAfter = 30;  // seconds
    unsigned days = 0;
};

// Throws BadStoreCommand.
StoreCommand parseStoreCommand(int argc, const char* const* argv);

// Calls `visit` with the parser, from whose options manual pages and completion are made.
void showStoreDescription(const std::function<void(const CLI::App&)>& visit);

}  // namespace fleet

#endif
