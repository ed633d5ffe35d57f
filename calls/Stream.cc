#include "calls/Stream.h"

#include <algorithm>

namespace calls {

namespace {

// More frames than the window of any sender allows without an acknowledgement.
constexpr std::size_t mostWaiting = 16;

}  // namespace

KeptFrame::KeptFrame(const Sample& sample)
    : octets(sample.frame->octets.begin(), sample.frame->octets.end()),
      frame(*sample.frame),
      number(sample.number),
      at(sample.at) {
    frame.octets = {};
}

Sample KeptFrame::sample() const { return {&frame, number, at, isdn::parseLayer2(octets)}; }

void Stream::reset() {
    hole_.reset();
    waiting_.clear();
    recovering_ = false;
    known_ = firm_ = true;
    next_ = expected_ = acknowledged_ = 0;
}

void Stream::loosen() {
    hole_.reset();
    waiting_.clear();
    recovering_ = firm_ = false;
}

std::optional<Hole> Stream::giveUp() {
    waiting_.clear();
    const std::optional<Hole> hole = hole_;
    hole_.reset();
    return hole;
}

void Stream::keep(const Sample& sample) {
    const bool there = std::ranges::any_of(
        waiting_, [&](const KeptFrame& kept) { return kept.sample().layer2.ns == sample.layer2.ns; });
    if (!there && waiting_.size() < mostWaiting)
        waiting_.emplace_back(sample);
}

Stream::Taken Stream::take(const Sample& sample, std::string_view recorded) {
    const std::uint8_t ns = sample.layer2.ns;
    Taken taken;
    if (!firm_) {
        if (known_ && !recorded.empty() && isAhead(ns, next_)) {
            taken.found = Hole{next_, ahead(ns, next_), sample.number, sample.at, recorded};
            taken.by = LostBy::recorder;
        }
        if (!known_)
            acknowledged_ = ns;
        known_ = firm_ = true;
        expected_ = next_ = ns;
    }
    taken.again = ns != next_ && !isAhead(ns, next_);
    if (isAhead(ns, expected_))
        takeAhead(sample, recorded, taken);
    else if (ns != expected_)
        taken.verdict = Verdict::duplicate;
    else if (hole_) {
        // The first missing frame is sent again, so the receiver had not received it.
        taken.decided = giveUp();
        taken.by = LostBy::line;
    }
    if (taken.verdict == Verdict::accepted) {
        expected_ = after(ns);
        recovering_ = false;
    }
    if (!taken.again)
        next_ = after(ns);
    return taken;
}

void Stream::takeAhead(const Sample& sample, std::string_view recorded, Taken& taken) {
    const std::uint8_t ns = sample.layer2.ns;
    if (recovering_) {
        taken.verdict = Verdict::ahead;
        return;
    }
    if (!hole_) {
        taken.found = Hole{expected_, ahead(ns, expected_), sample.number, sample.at, recorded};
        if (sample.from() == Side::peer && recorded.empty())
            hole_ = taken.found;
        else
            taken.by = LostBy::recorder;
    }
    if (hole_) {
        keep(sample);
        taken.verdict = Verdict::waiting;
    }
}

Stream::Taken Stream::acknowledged(const Sample& sample, std::string_view recorded,
                                   std::vector<KeptFrame>& accepted) {
    const std::uint8_t nr = sample.layer2.nr;
    Taken taken;
    if (!firm_) {
        if (!known_ || isAhead(nr, next_))
            next_ = expected_ = acknowledged_ = nr;
        known_ = true;
        return taken;
    }
    if (isAhead(nr, next_) && !recorded.empty()) {
        taken.found = Hole{next_, ahead(nr, next_), sample.number, sample.at, recorded};
        taken.by = LostBy::recorder;
        loosen();
        next_ = expected_ = acknowledged_ = nr;
        return taken;
    }
    if (hole_ && isAhead(nr, expected_)) {
        // The receiver has received the frames that the trace lacks, and those behind them that it
        // acknowledges.
        std::vector<KeptFrame> waiting = std::move(waiting_);
        taken.decided = giveUp();
        taken.by = LostBy::recorder;
        expected_ = nr;
        for (KeptFrame& kept : waiting) {
            const std::uint8_t ns = kept.sample().layer2.ns;
            if (isAhead(ns, expected_))
                continue;
            if (ns == expected_)
                expected_ = after(ns);
            accepted.push_back(std::move(kept));
        }
    } else if (hole_ && nr == expected_ && sample.layer2.type == isdn::FrameType::REJ) {
        taken.decided = giveUp();
        taken.by = LostBy::line;
        recovering_ = true;
    } else if (recovering_ && isAhead(nr, expected_)) {
        expected_ = nr;
        recovering_ = false;
    }
    if (ahead(nr, acknowledged_) <= ahead(next_, acknowledged_))
        acknowledged_ = nr;
    return taken;
}

}  // namespace calls
