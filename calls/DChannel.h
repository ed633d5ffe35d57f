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
#include "calls/Timers.h"
#include "capture/Frame.h"

namespace calls {

// Takes the frames of one D channel in their order. Memory is bounded: a link for each SAPI and TEI at most,
// and a few kept frames each. Used by one thread at a time.
class DChannel {
  public:
    // `role` is that of our side if it was given from outside; it is not questioned then.
    explicit DChannel(const Timers& timers = {}, capture::Role role = capture::Role::unknown);
    DChannel(const DChannel&) = delete;  // links look at the timers
    DChannel& operator=(const DChannel&) = delete;

    // `number` counts the frames of the input from 1; `at` is nanoseconds on this D channel's clock, which
    // never goes back. What it returns, and what the functions below give, is about this frame and valid
    // until the next one.
    const Marks& take(const capture::Frame& frame, std::uint64_t number, std::int64_t at);

    // What the recorder has to say between frames: it may have missed some (`reason` in words, a literal); it
    // has seen one of `side` without its octets; it was started again, and nothing is known about the links.
    void mayMiss(std::string_view reason);
    void mayLack(Side side);
    void restarted();
    // No frame follows. What was left open is in events().
    void finish();

    const Sample& sample() const { return sample_; }
    const isdn::Layer2& layer2() const { return sample_.layer2; }
    const Marks& marks() const { return marks_; }
    // The link of the last frame; null before the first one, and for a frame without an address.
    const Link* link() const { return link_; }
    std::span<const LinkEvent> events() const { return events_; }
    // Frames that came earlier and are accepted only now, oldest first. They come before the frame itself.
    std::span<const KeptFrame> late() const { return late_; }

    // Null if nothing was seen of it.
    const Link* find(std::uint8_t sapi, std::uint8_t tei) const;
    // Of our side, from whichever link has shown it first.
    capture::Role role() const;

  private:
    static constexpr std::size_t places = std::size_t{64} * 128;  // SAPI and TEI

    Link& linkOf(const isdn::Layer2& frame);

    Timers timers_;
    capture::Role fixed_;
    CommandBits shared_;  // from all links: for those that have not shown it themselves
    std::vector<std::unique_ptr<Link>> byAddress_;
    std::vector<std::pair<std::uint8_t, Link*>> links_;  // with their TEIs
    Link* link_ = nullptr;
    capture::Frame frame_;  // the last one; its octets are the caller's
    Sample sample_{};
    Marks marks_;
    std::vector<LinkEvent> events_;
    std::vector<KeptFrame> late_;
};

}  // namespace calls

#endif
