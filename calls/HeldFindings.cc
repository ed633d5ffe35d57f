#include "calls/HeldFindings.h"

#include <utility>

namespace calls {

void HeldFindings::report(Finding finding, const Message& message) {
    const std::uint8_t tei = message.layer2.tei;
    const Side before = other(message.from());
    const LinkWitness* const link = links_.witness(tei);
    if (link == nullptr || !link->holeOpen[static_cast<std::size_t>(before)])
        sink_.report(std::move(finding));
    else if (held_.size() < mostHeld)
        held_.push_back({std::move(finding), tei, before, message.at});
}

void HeldFindings::advance() {
    std::erase_if(held_, [&](Held& held) {
        const LinkWitness& link = *links_.witness(held.tei);
        const auto side = static_cast<std::size_t>(held.before);
        if (link.lastHole[side] >= held.at || link.lastDown >= held.at)
            return true;
        if (link.holeOpen[side])
            return false;
        sink_.report(std::move(held.finding));
        return true;
    });
}

}  // namespace calls
