#include "calls/WitnessKeeper.h"

namespace calls {

void WitnessKeeper::take(const isdn::Layer2& frame, Side from, std::uint64_t number, std::int64_t at,
                         const Marks& marks, std::span<const LinkEvent> events) {
    const bool isUp = marks.state == LinkState::up || marks.state == LinkState::unknown;
    if (!isUp || marks.linkUp || marks.linkDown || marks.unseenSetUp)
        witness_.lastDown = at;
    witness_.up = isUp;
    for (const LinkEvent& event : events) {
        if (event.kind == LinkEvent::Kind::hole)
            witness_.lastHole[static_cast<std::size_t>(event.from)] = at;
    }
    if (marks.linkUp || marks.unseenSetUp)
        sent_ = {};
    if (frame.hasNs() && !marks.retransmitted) {
        auto& sent = sent_[static_cast<std::size_t>(from)];
        sent.emplace_back(frame.ns, number);
        if (sent.size() > 128)
            sent.pop_front();
    }
    if (frame.hasNr())
        acknowledge(other(from), frame.nr);
}

void WitnessKeeper::acknowledge(Side sender, std::uint8_t nr) {
    auto& sent = sent_[static_cast<std::size_t>(sender)];
    while (!sent.empty() && isAhead(nr, sent.front().first)) {
        witness_.acknowledged[static_cast<std::size_t>(sender)] = sent.front().second;
        sent.pop_front();
    }
}

}  // namespace calls
