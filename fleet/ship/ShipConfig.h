// What a shipper is told: its configuration file.
#ifndef FLEET_SHIP_SHIPCONFIG_H
#define FLEET_SHIP_SHIPCONFIG_H

#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "fleet/Nats.h"
#include "fleet/ship/Packer.h"
#include "fleet/streams.h"

namespace fleet {

// A configuration that cannot be obeyed. what() names the file, the line and the reason.
class BadConfig : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct ShippedDChannel {
    ParcelHead head;
    // One of the two.
    std::string folder;  // where lapdread record keeps the recordings of head.trunk
    std::string log;     // a log or a FIFO of lapdmon
};

// docs/user/fleet.md describes the file.
struct ShipConfig {
    NatsOptions nats;
    std::string stream = siteStream;    // whose filling is watched
    std::string state;                  // the folder of places
    std::optional<std::string> redact;  // key file; pseudonyms are sent in place of numbers
    unsigned leastFree = 10;            // per cent of a disk or a stream; less is said
    std::string metrics;                // where to listen for those who ask for figures; empty: nowhere
    std::vector<ShippedDChannel> dChannels;
};

// Relative paths are relative to the folder of the file. `redact` is a key file in place of the
// configuration's, unless it is empty. Throws BadConfig.
ShipConfig readShipConfig(const std::string& path, const std::string& redact = {});

}  // namespace fleet

#endif
