// The configuration file of a shipper.
#ifndef FLEET_SHIP_SHIPCONFIG_H
#define FLEET_SHIP_SHIPCONFIG_H

#include <chrono>
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
    // The input: one of these two, the other is empty.
    std::string folder;  // where lapdread record keeps the recordings of head.trunk
    std::string log;     // a log or a FIFO of lapdmon
};

// docs/user/fleet-shipping.md describes the file.
struct ShipConfig {
    NatsOptions nats;
    std::string stream = siteStream;    // the stream whose filling is watched
    std::string state;                  // the folder of places
    std::optional<std::string> redact;  // key file; pseudonyms are sent in place of numbers
    // A server that fails may lose what it confirmed so long before, and nothing older. 0: it loses nothing.
    std::chrono::seconds resendWindow{120};
    unsigned leastFree = 10;  // per cent of a disk or a stream; a line says when less is free
    std::string metrics;      // the address at which figures are offered; empty: nowhere
    std::vector<ShippedDChannel> dChannels;
};

// Reads the file. Relative paths in it are relative to its folder. If `redact` is not empty, it is the key
// file in place of the one that the configuration names. Throws BadConfig.
ShipConfig readShipConfig(const std::string& path, const std::string& redact = {});

}  // namespace fleet

#endif
