// How far a shipper has come with a D channel, as it is noted on disk. Safe means that the stream has
// confirmed it.
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
    bool isEnded = false;                       // the end of the run is safe as well
    std::optional<recording::RecordedLog> log;  // the log of the run, if the shipper itself reads a log
};

// Returns nothing if there is no such file. Throws std::runtime_error, which names the file, if it is
// damaged.
std::optional<Place> readPlace(const std::string& path);

// Replaces the file in one step (rename). Returns words that say what went wrong, or nothing.
std::optional<std::string> writePlace(const Place& place, const std::string& dChannel,
                                      const std::string& path, recording::Durability durability);

}  // namespace fleet

#endif
