// Keeps the witness of a link up to date from its frames.
#ifndef CALLS_WITNESSKEEPER_H
#define CALLS_WITNESSKEEPER_H

#include <array>
#include <deque>
#include <utility>

#include "calls/Link.h"
#include "calls/LinkWitness.h"
#include "calls/Message.h"

namespace calls {

class WitnessKeeper {
  public:
    // Call this after the link has taken the frame. `marks` and `events` are those of this frame.
    void take(const isdn::Layer2& frame, Side from, std::uint64_t number, std::int64_t at, const Marks& marks,
              std::span<const LinkEvent> events);
    const LinkWitness& witness() const { return witness_; }

  private:
    void acknowledge(Side sender, std::uint8_t nr);

    LinkWitness witness_;
    // By side: N(S) and frame number of the I frames that the other side has not acknowledged, at most 128.
    std::array<std::deque<std::pair<std::uint8_t, std::uint64_t>>, 2> sent_;
};

}  // namespace calls

#endif
