#include "calls/WitnessKeeper.h"

namespace calls {

namespace {

constexpr unsigned fewMissing = 7;  // a window; the recorder has lost single frames, and no stretch of time

}  // namespace

void WitnessKeeper::take(const DChannel& channel) {
    const Sample& sample = channel.sample();
    const isdn::Layer2& frame = sample.layer2;
    const Marks& marks = channel.marks();
    witness_.heard[indexOf(sample.from())] = true;
    witness_.lastHeard = sample.at;
    const bool isUp = marks.state == LinkState::up || marks.state == LinkState::unknown;
    if (!isUp || marks.linkUp || marks.linkDown || marks.unseenSetUp)
        witness_.lastDown = sample.at;
    witness_.up = isUp;
    for (const LinkEvent& event : channel.events()) {
        // Frames that the line has lost do not count, because they are sent again.
        if (event.kind != LinkEvent::Kind::hole || event.by == LostBy::line)
            continue;
        witness_.lastHole[indexOf(event.from)] = sample.at;
        // So many frames are missing that those of the other side may be, too, and their numbers may have
        // come round to where they were.
        if (event.hole.count > fewMissing)
            witness_.lastHole[indexOf(other(event.from))] = sample.at;
    }
    if (marks.linkUp || marks.unseenSetUp) {
        sent_ = {};
        nrAbout_ = {};
    }
    if (frame.hasNs() && !marks.retransmitted) {
        auto& sent = sent_[indexOf(sample.from())];
        sent.emplace_back(frame.ns, sample.number);
        if (sent.size() > 128)
            sent.pop_front();
    }
    if (frame.hasNr())
        acknowledge(other(sample.from()), frame.nr);
    judgeNumbers(sample, marks, *channel.link());
}

void WitnessKeeper::judgeNumbers(const Sample& sample, const Marks& marks, const Link& link) {
    for (const Side side : {Side::us, Side::peer}) {
        const std::size_t index = indexOf(side);
        witness_.holeOpen[index] = link.mayLackFramesOf(side);
        const bool unseen = link.hasAcknowledgedUnseen(side, sample.at);
        if (unseen && !unseen_[index])
            witness_.lastHole[index] = sample.at;
        unseen_[index] = unseen;
        const bool isNext = side == sample.from() && sample.layer2.hasNs() && !marks.retransmitted;
        if (side == sample.from() || !sample.layer2.hasNr()) {
            if (isNext && !witness_.holeOpen[index] && witness_.lastHole[index] != sample.at)
                witness_.wholeUntil[index] = sample.at;
            continue;
        }
        // Before the first I frame of a side, only N(R) tells what it has sent.
        const std::uint8_t nr = sample.layer2.nr;
        const Stream& stream = link.sentBy(side);
        const std::uint8_t known = stream.isFirm() ? stream.next() : nrAbout_[index].value_or(nr);
        if (nr == known && !witness_.holeOpen[index] && witness_.lastHole[index] != sample.at)
            witness_.wholeUntil[index] = sample.at;
        else if (!stream.isFirm() && isAhead(nr, known))
            witness_.lastHole[index] = sample.at;
        nrAbout_[index] = nr;
    }
}

void WitnessKeeper::mayMiss(std::int64_t at) { witness_.lastLoss = {at, at}; }

void WitnessKeeper::lacks(Side side, std::int64_t at) { witness_.lastHole[indexOf(side)] = at; }

void WitnessKeeper::acknowledge(Side sender, std::uint8_t nr) {
    auto& sent = sent_[indexOf(sender)];
    while (!sent.empty() && isAhead(nr, sent.front().first)) {
        witness_.acknowledged[indexOf(sender)] = sent.front().second;
        sent.pop_front();
    }
}

}  // namespace calls
