// Keeps the witness of a link up to date from its frames.
#ifndef CALLS_WITNESSKEEPER_H
#define CALLS_WITNESSKEEPER_H

#include <array>
#include <deque>
#include <optional>
#include <utility>

#include "calls/DChannel.h"
#include "calls/LinkWitness.h"
#include "calls/Message.h"

namespace calls {

class WitnessKeeper {
  public:
    // Takes what the channel says about its last frame, which must belong to this link.
    void take(const DChannel& channel);
    // The recorder may have missed frames before `at`.
    void mayMiss(std::int64_t at);
    // The recorder has seen a frame of this side without its octets.
    void lacks(Side side, std::int64_t at);
    const LinkWitness& witness() const { return witness_; }

  private:
    void acknowledge(Side sender, std::uint8_t nr);
    void judgeNumbers(const Sample& sample, const Marks& marks, const Link& link);

    LinkWitness witness_;
    // By side: N(S) and frame number of the I frames that the other side has not acknowledged, at most 128.
    std::array<std::deque<std::pair<std::uint8_t, std::uint64_t>>, 2> sent_;
    std::array<std::optional<std::uint8_t>, 2> nrAbout_;  // by side: the last N(R) about its frames
    std::array<bool, 2>
        unseen_{};  // by side: an N(R) has shown that frames are missing; the next one decides
};

}  // namespace calls

#endif
