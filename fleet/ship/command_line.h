// The command line of lapdship.
#ifndef FLEET_SHIP_COMMAND_LINE_H
#define FLEET_SHIP_COMMAND_LINE_H

#include <cstdint>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

#include "fleet/streams.h"

namespace CLI {
class App;
}

namespace fleet {

// A command line that cannot be obeyed.
class BadShipCommand : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct ShipCommand {
    enum class What : std::uint8_t {
        ship,    // until a signal ends it
        once,    // what is there, and then no more
        streams  // makes streams
    };

    std::string told;  // help or version: print it and end
    What what = What::ship;
    std::string config;
    std::string redact;                // a key file, in place of the configuration's
    std::vector<StreamRules> streams;  // to make
};

// Throws BadShipCommand.
ShipCommand parseShipCommand(int argc, const char* const* argv);

// For manual pages and completion: the parser as it describes itself.
void showShipDescription(const std::function<void(const CLI::App&)>& visit);

}  // namespace fleet

#endif
