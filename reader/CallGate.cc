#include "reader/CallGate.h"

#include <utility>

namespace reader {

namespace {

bool carriesMessage(const Seen& seen) {
    if (!seen.isFrame())
        return false;
    const isdn::Layer2 link = isdn::parseLayer2(seen.frame().octets);
    return link.carriesMessage() && link.header.size() >= 3;
}

}  // namespace

CallGate::Held::Held(const Seen& from)
    : seen(from),
      item(*from.item),
      octets(item.frame.octets.begin(), item.frame.octets.end()),
      text(item.text) {}

const Seen& CallGate::Held::view() {
    item.frame.octets = octets;
    item.text = text;
    seen.item = &item;
    return seen;
}

CallGate::CallGate(const CallFilter& filter, const calls::Options& options, Order order, std::size_t most)
    : filter_(filter), order_(order), most_(most), analysis_(options, *this) {}

void CallGate::take(const Seen& seen, bool passes) {
    const bool mayBelong = carriesMessage(seen);
    if (passes && (mayBelong || filter_.wantsRest())) {
        const auto held = held_.emplace_hint(held_.end(), ++lastPlace_, Held(seen));
        if (mayBelong)
            unclaimed_.emplace(seen.number, lastPlace_);
        else
            decide(held, true);
    }
    feed(analysis_, seen);
    release();
}

void CallGate::advance(std::int64_t nanoseconds) {
    analysis_.advance(nanoseconds);
    release();
}

void CallGate::finish() {
    analysis_.finish();
    release();
}

const Seen* CallGate::next() {
    if (ready_.empty())
        return nullptr;
    given_.emplace(std::move(ready_.front()));
    ready_.pop_front();
    return &given_->view();
}

void CallGate::claim(std::uint64_t frame, const calls::Call* call) {
    const auto known = unclaimed_.find(frame);
    if (known == unclaimed_.end())
        return;
    const auto held = held_.find(known->second);
    unclaimed_.erase(known);
    if (held != held_.end())
        settle(held, call);
}

void CallGate::settle(HeldItems::iterator held, const calls::Call* call) {
    const std::optional<bool> wanted = call == nullptr ? filter_.wantsRest() : filter_.wants(call->number);
    if (wanted)
        decide(held, *wanted);
    else
        undecided_[call->number].push_back(held->first);
}

void CallGate::decide(HeldItems::iterator held, bool wanted) {
    if (wanted && order_ == Order::ofInput) {
        held->second.wanted = true;
        return;
    }
    if (wanted)
        ready_.push_back(std::move(held->second));
    held_.erase(held);
}

void CallGate::gone(const calls::Call& call) {
    const auto frames = undecided_.extract(call.number);
    if (frames.empty())
        return;
    const bool wanted = filter_.wants(call);
    for (const Place place : frames.mapped()) {
        if (const auto held = held_.find(place); held != held_.end())
            decide(held, wanted);
    }
}

// Releases the wanted items, up to the first item that is not decided yet.
void CallGate::release() {
    while (!held_.empty()) {
        const auto first = held_.begin();
        if (first->second.wanted)
            ready_.push_back(std::move(first->second));
        else if (held_.size() > most_)
            ++letGo_;
        else
            return;
        held_.erase(first);
    }
}

}  // namespace reader
