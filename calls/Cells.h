// The channels of a trunk as a row of cells: what each is used for at this moment.
#ifndef CALLS_CELLS_H
#define CALLS_CELLS_H

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "calls/Analysis.h"
#include "calls/Occupancy.h"

namespace calls {

enum class Use : std::uint8_t {
    idle,
    setUp,
    talking,
    clearing,
    held,  // its call is on hold, and no other has it
    outOfService,
    restarting,
    dChannel,
    neverSeen  // no call was ever on it
};
// "idle", "set-up", "talking", "clearing", "held", "out of service", "restarting", "D channel", "never seen".
std::string_view nameOf(Use use);

struct ChannelCell {
    ChannelKey channel{};
    Use use = Use::idle;
    std::optional<Side> by{};  // the side that took it out of service
    std::uint64_t call = 0;    // the number of the call that is on it; 0: none
};

// The channels of one interface of a D channel, or of the D channels that share their calls.
struct CellRow {
    std::uint32_t group = 0;
    std::optional<std::uint32_t> interface {};
    TrunkSize size = TrunkSize::unknown;
    bool isLearnt = false;  // the size was not given; the channels in use suggest it
    std::vector<ChannelCell> cells{};
};

// Makes the rows of all groups of which `occupancy` knows channels. `size` is the size of the trunks; if it
// is unknown, it is learnt from the channels in use.
std::vector<CellRow> cellRows(const Analysis& analysis, const Occupancy& occupancy, TrunkSize size);

}  // namespace calls

#endif
