// One component instance of a board: its parameters, its subscriptions, and the frames it has to report.
#ifndef SOFTBOARD_COMPONENT_H
#define SOFTBOARD_COMPONENT_H

#include <map>
#include <optional>
#include <vector>

#include "softboard/message.h"
#include "softboard/player.h"

namespace softboard {

struct Parameter {
    uint32_t value = 0;
    uint32_t largest = 0;  // that may be set
    bool settable = false;
    std::string text;
};

struct Subscription {
    uint32_t event = 0;
    Address returnTo;
};

struct Component {
    Address address;
    uint8_t type = 0;
    std::map<uint32_t, Parameter> parameters;
    std::vector<Subscription> subscriptions;
    std::optional<Player> player;  // of a D channel
    uint32_t label = 0;            // of its trace events
    bool played = false;           // since the trace was switched on: it plays once

    void subscribe(uint32_t event, const Address& returnTo);
    void cancel(uint32_t event, const Address& returnTo);
    // Ends all that would go to the address.
    void forget(const Address& returnTo);

    // Where trace events go.
    std::vector<Address> traceTargets() const;
    // Starts or stops the player as parameters and subscriptions say.
    void updatePlayer(Player::Time now);
};

Component tscComponent(uint8_t board);
Component ccsComponent(const DChannel& channel, std::shared_ptr<const Frames> frames);

}  // namespace softboard

#endif
