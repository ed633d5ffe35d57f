#include "softboard/component.h"

#include "softboard/codes.h"

namespace softboard {

void Component::subscribe(uint32_t event, const Address& returnTo) {
    cancel(event, returnTo);
    subscriptions.push_back({event, returnTo});
}

void Component::cancel(uint32_t event, const Address& returnTo) {
    std::erase_if(subscriptions,
                  [&](const Subscription& s) { return s.event == event && s.returnTo == returnTo; });
}

void Component::forget(const Address& returnTo) {
    std::erase_if(subscriptions, [&](const Subscription& s) { return s.returnTo == returnTo; });
}

std::vector<Address> Component::traceTargets() const {
    std::vector<Address> targets;
    for (const Subscription& subscription : subscriptions) {
        if (subscription.event == layer2TraceEvents) {
            targets.push_back(subscription.returnTo);
        }
    }
    return targets;
}

void Component::updatePlayer(Player::Time now) {
    if (!player) {
        return;
    }
    const auto trace = parameters.find(traceParameter);
    const bool traceOn = trace != parameters.end() && trace->second.value == 1;
    if (!traceOn || traceTargets().empty()) {
        player->stop();
        played = false;
    } else if (!played) {
        player->start(now);
        played = true;
    }
}

Component tscComponent(uint8_t board) {
    Component tsc;
    tsc.address = {0, board, 1, tscType, 0};
    tsc.type = tscType;
    return tsc;
}

Component ccsComponent(const DChannel& channel, std::shared_ptr<const Frames> frames) {
    Component ccs;
    ccs.address = {channel.number, channel.board, 1, ccsType, 0};
    ccs.type = ccsType;
    ccs.parameters[protocolParameter] = {channel.protocol, 0, false, {}};
    ccs.parameters[traceParameter] = {0, 1, true, {}};
    ccs.player.emplace(std::move(frames), channel.rate, channel.loop);
    ccs.label = channel.label;
    return ccs;
}

}  // namespace softboard
