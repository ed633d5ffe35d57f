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

// Describes the link of one TEI of one D channel after the last frame. WitnessKeeper keeps it up to date.
struct LinkWitness {
    static constexpr std::int64_t never = std::numeric_limits<std::int64_t>::min();

    // The last moment at which the link was known not to be up; a link that was up when the trace began has
    // always been up.
    std::int64_t lastDown = never;
    bool up = true;
    // By side: the number of its last I frame that the other side's N(R) has acknowledged, 0 for none, and
    // the last moment at which one of its I frames was found to be missing in the trace.
    std::array<std::uint64_t, 2> acknowledged{};
    std::array<std::int64_t, 2> lastHole{never, never};

    bool hasArrived(std::uint64_t frame, Side from) const {
        return acknowledged[static_cast<std::size_t>(from)] >= frame;
    }
    bool wasUpSince(std::int64_t at) const { return up && lastDown < at; }
    bool isWholeSince(std::int64_t at, Side from) const {
        return lastHole[static_cast<std::size_t>(from)] < at;
    }
};

// Why it cannot be told whether a question of `asker`, asked in `frame` at `at`, was answered; empty if it
// can. `link` may be null.
std::string_view doubtAbout(const LinkWitness* link, std::uint64_t frame, std::int64_t at, Side asker,
                            Side answering);

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
