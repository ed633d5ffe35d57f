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
        ship,    // ships until a signal ends it
        once,    // ships what is there and ends
        streams  // makes streams and ends
    };

    std::string told;  // if not empty: the text of --help or --version, to be printed before the program ends
    What what = What::ship;
    std::string config;
    std::string redact;                // key file in place of the configuration's; may be empty
    std::vector<StreamRules> streams;  // to make
};

// Throws BadShipCommand.
ShipCommand parseShipCommand(int argc, const char* const* argv);

// Calls `visit` with the parser, from whose options manual pages and completion are made.
void showShipDescription(const std::function<void(const CLI::App&)>& visit);

}  // namespace fleet

#endif
