// How far a shipper has come with a D channel: what is safe in the stream.
#ifndef FLEET_SHIP_PLACE_H
#define FLEET_SHIP_PLACE_H

#include <cstdint>
#include <optional>
#include <string>

#include "recording/RecordState.h"
#include "recording/files.h"

namespace fleet {

struct Place {
    std::uint64_t run = 0;                      // 0: nothing was shipped yet
    std::uint64_t next = 1;                     // the first frame of the run that is not safe
    bool isEnded = false;                       // that the run has ended is safe, too
    std::optional<recording::RecordedLog> log;  // that the run is read from, if the shipper itself reads one
};

// Nothing if there is no such file. Throws std::runtime_error, which names the file, if it is damaged.
std::optional<Place> readPlace(const std::string& path);

// Puts it in the place of the old one in one step. Returns what is wrong, or nothing.
std::optional<std::string> writePlace(const Place& place, const std::string& dChannel,
                                      const std::string& path, recording::Durability durability);

}  // namespace fleet

#endif
