// All links of one D channel: finds the link of a frame, and what the receivers' layer 2 accepts.
#ifndef CALLS_DCHANNEL_H
#define CALLS_DCHANNEL_H

#include <cstdint>
#include <memory>
#include <span>
#include <string_view>
#include <utility>
#include <vector>

#include "calls/CommandBits.h"
#include "calls/Link.h"
#include "calls/Message.h"
#include "calls/ServicePolls.h"
#include "calls/Timers.h"
#include "capture/Frame.h"

namespace calls {

// Takes the frames of one D channel in their order. Memory is bounded: a link for each SAPI and TEI at most,
// and a few kept frames each. Used by one thread at a time.
class DChannel {
  public:
    // `role` is the role of our side if the user has given it. It is then believed even if frames contradict
    // it.
    explicit DChannel(const Timers& timers = {}, capture::Role role = capture::Role::unknown);
    DChannel(const DChannel&) = delete;  // links look at the timers
    DChannel& operator=(const DChannel&) = delete;

    // `number` counts the frames of the input from 1; `at` is nanoseconds on this D channel's clock, which
    // never goes back. What it returns, and what the functions below give, is about this frame and valid
    // until the next one.
    const Marks& take(const capture::Frame& frame, std::uint64_t number, std::int64_t at);

    // What the recorder says between frames. mayMiss: it may have missed frames; `reason` says why and must
    // be a literal. mayLack: it has seen a frame of `side` without its octets. restarted: it was started
    // again, so nothing is known about the links any more.
    void mayMiss(std::string_view reason);
    void mayLack(Side side);
    void restarted();
    // Ends the trace. events() then holds what was left open.
    void finish();

    const Sample& sample() const { return sample_; }
    const isdn::Layer2& layer2() const { return sample_.layer2; }
    const Marks& marks() const { return marks_; }
    // The link of the last frame; null before the first one, and for a frame without an address.
    const Link* link() const { return link_; }
    std::span<const LinkEvent> events() const { return events_; }
    // Earlier frames that are accepted only now, oldest first. They were sent before the last frame.
    std::span<const KeptFrame> late() const { return late_; }

    // The link of this SAPI and TEI, or null if none of its frames was seen.
    const Link* find(std::uint8_t sapi, std::uint8_t tei) const;
    // The role of our side, as the first link that showed it has told.
    capture::Role role() const;

  private:
    static constexpr std::size_t places = std::size_t{64} * 128;  // SAPI and TEI

    Link& linkOf(const isdn::Layer2& frame);

    Timers timers_;
    capture::Role fixed_;
    ServicePolls servicePolls_;
    CommandBits shared_;  // what all links together have shown, for links that have not shown it themselves
    std::vector<std::unique_ptr<Link>> byAddress_;
    std::vector<std::pair<std::uint8_t, Link*>> links_;  // with their TEIs
    Link* link_ = nullptr;
    capture::Frame frame_;  // the last frame; the caller owns its octets
    Sample sample_{};
    Marks marks_;
    std::vector<LinkEvent> events_;
    std::vector<KeptFrame> late_;
};

}  // namespace calls

#endif
