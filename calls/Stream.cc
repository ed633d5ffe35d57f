#include "calls/Stream.h"

#include <algorithm>
#include <functional>

namespace calls {

namespace {

// More frames than the window of any sender allows without an acknowledgement.
constexpr std::size_t mostWaiting = 16;
// The line cannot lose more frames in a row than a window, and no D channel has one as wide as this.
constexpr unsigned mostLostOnLine = 32;

// The hash of a frame's information, never 0.
std::uint32_t textOf(const isdn::Layer2& frame) {
    const std::string_view octets(reinterpret_cast<const char*>(frame.information.data()),
                                  frame.information.size());
    return static_cast<std::uint32_t>(std::hash<std::string_view>()(octets)) | 1U;
}

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
    texts_.fill(0);
}

void Stream::loosen() {
    hole_.reset();
    waiting_.clear();
    recovering_ = firm_ = false;
    texts_.fill(0);
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
    const std::uint32_t text = textOf(sample.layer2);
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
    if (taken.again && !mayRepeat(ns, text))
        goOnAt(sample, recorded, taken);
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
    for (; !taken.again && next_ != ns; next_ = after(next_))
        texts_[next_] = 0;  // it is missing, and may come as a repetition
    if (!taken.again)
        next_ = after(ns);
    texts_[ns] = text;
    return taken;
}

// So many frames are missing in the trace that numbers have come round to this one. The line cannot have lost
// them, because no sender sends more than a window without an acknowledgement.
void Stream::goOnAt(const Sample& sample, std::string_view recorded, Taken& taken) {
    const std::uint8_t ns = sample.layer2.ns;
    taken.found = Hole{expected_, ahead(ns, expected_), sample.number, sample.at, recorded};
    taken.by = LostBy::recorder;
    taken.again = false;
    giveUp();
    recovering_ = false;
    texts_.fill(0);
    expected_ = next_ = acknowledged_ = ns;
}

void Stream::takeAhead(const Sample& sample, std::string_view recorded, Taken& taken) {
    const std::uint8_t ns = sample.layer2.ns;
    if (recovering_) {
        taken.verdict = Verdict::ahead;
        return;
    }
    if (!hole_) {
        taken.found = Hole{expected_, ahead(ns, expected_), sample.number, sample.at, recorded};
        const bool mayBeLine = sample.from() == Side::peer && taken.found->count <= mostLostOnLine;
        if (mayBeLine && recorded.empty())
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
