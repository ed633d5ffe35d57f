#include "calls/DChannel.h"

namespace calls {

namespace {

std::optional<bool> commandBy(capture::Role role, const Sample& sample) {
    if (role == capture::Role::unknown)
        return std::nullopt;
    const bool sentByNetwork = (role == capture::Role::network) == (sample.from() == Side::us);
    return isdn::isCommand(sample.layer2.cr, sentByNetwork);
}

std::size_t placeOf(std::uint8_t sapi, std::uint8_t tei) { return std::size_t{sapi} << 7 | tei; }

}  // namespace

DChannel::DChannel(const Timers& timers, capture::Role role)
    : timers_(timers), fixed_(role), byAddress_(places) {}

Link& DChannel::linkOf(const isdn::Layer2& frame) {
    std::unique_ptr<Link>& link = byAddress_[placeOf(frame.sapi, frame.tei)];
    if (!link) {
        link = std::make_unique<Link>(timers_);
        links_.emplace_back(frame.tei, link.get());
    }
    return *link;
}

const Link* DChannel::find(std::uint8_t sapi, std::uint8_t tei) const {
    const std::size_t place = placeOf(sapi, tei);
    return place < places ? byAddress_[place].get() : nullptr;
}

const Marks& DChannel::take(const capture::Frame& frame, std::uint64_t number, std::int64_t at) {
    events_.clear();
    late_.clear();
    marks_ = {};
    link_ = nullptr;
    frame_ = frame;
    sample_ = {&frame_, number, at, isdn::parseLayer2(frame.octets)};
    if (sample_.layer2.header.size() < 3) {
        marks_.role = role();
        return marks_;
    }
    shared_.learn(sample_.layer2, sample_.from(), at, timers_.t200);
    sample_.command = commandBy(fixed_, sample_);
    sample_.assumed = shared_.isCommand(sample_.layer2.cr, sample_.from());
    if (!sample_.assumed)
        sample_.assumed = commandBy(frame.role, sample_);
    link_ = &linkOf(sample_.layer2);
    marks_ = link_->take(sample_, events_, late_);
    const isdn::Octets information = sample_.layer2.information;
    if (sample_.layer2.type == isdn::FrameType::I && marks_.accepted.value_or(false) &&
        !information.empty() && isdn::isMaintenance(information.front()))
        servicePolls_.take(sample_, timers_.t200, marks_);
    for (LinkEvent& event : events_)
        event.tei = sample_.layer2.tei;
    if (fixed_ != capture::Role::unknown)
        marks_.role = fixed_;
    else if (marks_.role == capture::Role::unknown)
        marks_.role = shared_.role() == capture::Role::unknown ? frame.role : shared_.role();
    return marks_;
}

capture::Role DChannel::role() const { return fixed_ != capture::Role::unknown ? fixed_ : shared_.role(); }

void DChannel::mayMiss(std::string_view reason) {
    for (const auto& [tei, link] : links_)
        for (const Side side : {Side::us, Side::peer})
            link->mayMiss(side, reason);
}

void DChannel::mayLack(Side side) {
    for (const auto& [tei, link] : links_)
        link->mayLack(side);
}

void DChannel::restarted() {
    servicePolls_ = {};
    for (const auto& [tei, link] : links_)
        link->forget();
}

void DChannel::finish() {
    events_.clear();
    late_.clear();
    for (const auto& [tei, link] : links_) {
        const std::size_t before = events_.size();
        link->finish(events_);
        for (std::size_t i = before; i < events_.size(); ++i)
            events_[i].tei = tei;
    }
}

}  // namespace calls
