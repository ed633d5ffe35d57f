// From the items of a recording to the analysis of calls: frames, and what the recorder said between them.
#ifndef CALLS_RECORDING_H
#define CALLS_RECORDING_H

#include <cstdint>
#include <string_view>

#include "calls/Analysis.h"
#include "capture/Item.h"

namespace calls {

// Why frames may be missing behind an item, in a few words; empty if none are.
std::string_view reasonOf(capture::Item::Kind kind);

// Tells an analysis, or whoever hears the same, what the recorder had to say between frames.
template <class Hearer>
void tell(Hearer& hearer, const capture::Item& item) {
    const capture::Interface& interface = *item.frame.interface;
    if (item.kind == capture::Item::Kind::oversized)
        hearer.mayLack(interface, item.frame.transmitted ? Side::us : Side::peer);
    else if (item.kind == capture::Item::Kind::restart || item.kind == capture::Item::Kind::run ||
             item.kind == capture::Item::Kind::replaced)
        hearer.restarted(interface);
    else if (const std::string_view reason = reasonOf(item.kind); !reason.empty())
        hearer.mayMiss(interface, reason);
}

// Hands a frame on, or what the recorder says. `number` is the frame's.
void feed(Analysis& analysis, const capture::Item& item, std::uint64_t number);

}  // namespace calls

#endif
