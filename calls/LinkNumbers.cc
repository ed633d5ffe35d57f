// The part of Link that follows the sequence numbers N(S) and N(R).
#include <functional>
#include <utility>

#include "calls/Link.h"

namespace calls {

using isdn::FrameType;

namespace {

std::size_t textOf(const isdn::Layer2& frame) {
    return std::hash<std::string_view>()(
        {reinterpret_cast<const char*>(frame.information.data()), frame.information.size()});
}

}  // namespace

void Link::supervise(const Sample& sample, std::vector<LinkEvent>& events, std::vector<KeptFrame>& late) {
    isAlive(sample);
    const Side sender = other(sample.from());  // the side whose frames N(R) acknowledges
    if (beginsAgain(sample))
        return;
    Stream& stream = streams_[indexOf(sender)];
    std::optional<PendingNr>& pending = beyond_[indexOf(sample.from())];
    const bool behind = stream.isLongAcknowledged(sample.layer2.nr);
    if ((behind || stream.isBeyond(sample.layer2.nr)) && missing_[indexOf(sender)].reason.empty() && !pending)
        pending = PendingNr{sample.layer2.nr, sample.number, sample.at, behind};
    report(sample, sender, stream.acknowledged(sample, missing_[indexOf(sender)].reason, late), events);
}

// Whether the numbers of the link begin again: both are 0, the octets are new, and counting on would not have
// led to 0.
bool Link::beginsAgain(const Sample& sample) const {
    const isdn::Layer2& frame = sample.layer2;
    const Stream& stream = streams_[indexOf(sample.from())];
    return frame.type == FrameType::I && frame.ns == 0 && frame.nr == 0 && stream.isFirm() &&
           stream.next() != 0 && textOf(frame) != firstText_[indexOf(sample.from())];
}

void Link::beginNumbers() {
    ++numbering_;
    for (Stream& stream : streams_)
        stream.reset();
    beyond_ = {};
}

void Link::information(const Sample& sample, Marks& marks, std::vector<LinkEvent>& events) {
    const Side from = sample.from();
    if (beginsAgain(sample)) {
        giveUpHoles(events);
        beginNumbers();
        marks.unseenSetUp = true;
        events.push_back({LinkEvent::Kind::unseenSetUp, from, sample.number, sample.at});
    }
    if (sample.layer2.ns == 0)
        firstText_[indexOf(from)] = textOf(sample.layer2);
    if (state_ != LinkState::up && state_ != LinkState::unknown) {
        marks.accepted = false;
        return;
    }
    Stream& stream = streams_[indexOf(from)];
    std::string_view recorded = std::exchange(missing_[indexOf(from)].reason, {});
    // The receiver has acknowledged these frames, so they were sent and are missing in the trace.
    const std::optional<PendingNr>& pending = beyond_[indexOf(other(from))];
    if (pending && recorded.empty() && stream.isFirm() && isAhead(sample.layer2.ns, stream.next()) &&
        !isAhead(pending->nr, sample.layer2.ns))
        recorded = "the receiver has acknowledged it";
    const Stream::Taken taken = stream.take(sample, recorded);
    marks.retransmitted = taken.again;
    marks.outOfSequence = taken.found.has_value() || taken.verdict == Stream::Verdict::waiting ||
                          taken.verdict == Stream::Verdict::ahead;
    if (taken.verdict != Stream::Verdict::waiting)
        marks.accepted = taken.verdict == Stream::Verdict::accepted;
    report(sample, from, taken, events);
    missing_[indexOf(from)].seen = 0;
    settleNr(sample, taken, events);
}

// Decides about an N(R) that acknowledged more than was seen, now that the sender has shown how far it was.
// It waits for that because the two directions are recorded up to 8 ms out of order.
void Link::settleNr(const Sample& sample, const Stream::Taken& taken, std::vector<LinkEvent>& events) {
    std::optional<PendingNr>& pending = beyond_[indexOf(other(sample.from()))];
    if (!pending)
        return;
    const bool goesOn = taken.verdict == Stream::Verdict::accepted && !taken.again;
    const Stream& stream = streams_[indexOf(sample.from())];
    const bool covered = !isAhead(pending->nr, stream.next());
    const bool prompt = sample.at - pending->at <= timers_->slack;
    if (!covered && prompt)
        return;
    // Numbers that do not go on show that a new set-up is missing, and nothing about this N(R).
    if (pending->behind && !goesOn)
        return pending.reset();
    // Whether a hole up to this number has been reported already, as one that the recorder made.
    const bool holeWasReported = !events.empty() && events.back().kind == LinkEvent::Kind::hole &&
                                 events.back().frame == sample.number;
    if ((pending->behind || !(covered && prompt)) && !holeWasReported)
        events.push_back({.kind = LinkEvent::Kind::nrInvalid,
                          .from = other(sample.from()),
                          .frame = pending->frame,
                          .at = pending->at,
                          .number = pending->nr});
    pending.reset();
}

void Link::report(const Sample& sample, Side sender, const Stream::Taken& taken,
                  std::vector<LinkEvent>& events) {
    if (!taken.by)
        return;
    const Hole& hole = taken.decided ? *taken.decided : *taken.found;
    if (*taken.by == LostBy::recorder && hole.count == missing_[indexOf(sender)].seen)
        return;
    events.push_back({.kind = LinkEvent::Kind::hole,
                      .from = sender,
                      .frame = taken.decided ? hole.frame : sample.number,
                      .at = taken.decided ? hole.at : sample.at,
                      .hole = hole,
                      .by = *taken.by});
}

void Link::giveUpHoles(std::vector<LinkEvent>& events) {
    for (const Side side : {Side::us, Side::peer}) {
        if (const std::optional<Hole> hole = streams_[indexOf(side)].giveUp())
            events.push_back({.kind = LinkEvent::Kind::hole,
                              .from = side,
                              .frame = hole->frame,
                              .at = hole->at,
                              .hole = *hole});
        if (const std::optional<PendingNr> pending = std::exchange(beyond_[indexOf(side)], std::nullopt))
            events.push_back({.kind = LinkEvent::Kind::nrInvalid,
                              .from = side,
                              .frame = pending->frame,
                              .at = pending->at,
                              .number = pending->nr});
    }
}

}  // namespace calls
