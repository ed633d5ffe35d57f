// What the link layer knows about the fate of messages. It decides whether a missing answer was really not
// sent, or may only be missing in the trace.
#ifndef CALLS_LINKWITNESS_H
#define CALLS_LINKWITNESS_H

#include <array>
#include <cstdint>
#include <limits>
#include <string_view>

#include "calls/Message.h"

namespace calls {

// Describes the link of one TEI of one D channel after the last frame. Arrays are by side. WitnessKeeper
// keeps it up to date.
struct LinkWitness {
    static constexpr std::int64_t never = std::numeric_limits<std::int64_t>::min();

    // The last moment at which the link was known not to be up; a link that was up when the trace began has
    // always been up.
    std::int64_t lastDown = never;
    bool up = true;
    // Some frame of the side is in the trace, of whichever layer.
    std::array<bool, 2> heard{};
    // When the last frame of either side came.
    std::int64_t lastHeard = never;
    // The number of its last I frame that the other side's N(R) has acknowledged, 0 for none.
    std::array<std::uint64_t, 2> acknowledged{};
    // The last moment at which one of its I frames was found to be missing in the trace; and whether one is
    // thought to be missing now, since the next numbers decide.
    std::array<std::int64_t, 2> lastHole{never, never};
    std::array<bool, 2> holeOpen{};
    // The last moment at which the recorder said that it may have missed frames.
    std::array<std::int64_t, 2> lastLoss{never, never};
    // The last moment at which its numbers, or the other side's N(R), showed that none is missing.
    std::array<std::int64_t, 2> wholeUntil{never, never};

    // Something was found to be missing at `at`.
    bool isShortAt(std::int64_t at) const { return lastHole[0] == at || lastHole[1] == at; }
    bool heardBoth() const { return heard[0] && heard[1]; }

    bool hasArrived(std::uint64_t frame, Side from) const {
        return acknowledged[static_cast<std::size_t>(from)] >= frame;
    }
    bool wasUpSince(std::int64_t at) const { return up && lastDown < at; }
    bool isWholeSince(std::int64_t at, Side from) const {
        const auto side = static_cast<std::size_t>(from);
        return lastHole[side] < at && !holeOpen[side] &&
               (lastLoss[side] < at || wholeUntil[side] > lastLoss[side]);
    }
};

// Gives the witness of the link that carries the calls of a TEI, or null if nothing is known of that link.
class LinkWitnesses {
  public:
    LinkWitnesses() = default;
    LinkWitnesses(const LinkWitnesses&) = delete;
    LinkWitnesses& operator=(const LinkWitnesses&) = delete;
    virtual ~LinkWitnesses() = default;
    virtual const LinkWitness* witness(std::uint8_t tei) const = 0;
};

}  // namespace calls

#endif
