// The state of a D channel at one moment, as a screen shows it.
#ifndef READER_BROWSE_TRUNK_H
#define READER_BROWSE_TRUNK_H

#include <cstdint>
#include <string>
#include <vector>

#include "calls/Cells.h"
#include "calls/Link.h"
#include "reader/TimeText.h"

namespace reader::browse {

struct LinkView {
    std::uint8_t tei = 0;
    calls::LinkState state = calls::LinkState::unknown;
    Instant since;
    bool sawSetUp = false;  // the trace shows the set-up; otherwise the link is up at least since then
};

struct TrunkView {
    std::string dChannel;
    capture::Role role = capture::Role::unknown;  // of our side
    std::vector<LinkView> links;
    std::uint64_t framesAMinute = 0;  // in the last minute of its clock
    std::uint64_t callsAMinute = 0;
    // The channels of its group. Only the group's first D channel has them.
    std::vector<calls::CellRow> cells;
};

}  // namespace reader::browse

#endif
