// Tables that show what happened in a trace over time.
#ifndef READER_OVERTIMETABLES_H
#define READER_OVERTIMETABLES_H

#include <vector>

#include "calls/LinkHistory.h"
#include "calls/Occupancy.h"
#include "reader/figureTables.h"

namespace reader {

// Channels in use, links, and link events, in this order. The first has a row for every step of time from the
// first in which a channel was in use to the last.
std::vector<FigureTable> overTimeTables(const calls::Occupancy& occupancy, const calls::LinkHistory& links);

}  // namespace reader

#endif
