// One component instance of a board: its parameters, the subscriptions to its events, and the frames that it
// plays.
//
// A component has no lock. The Network calls it under the network's lock.
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
    uint32_t largest = 0;  // the largest value that a host may set
    bool settable = false;
    std::string text;
};

// Events of type `event` are sent to the host queue with the address `returnTo`.
struct Subscription {
    uint32_t event = 0;
    Address returnTo;
};

struct Component {
    Address address;
    uint8_t type = 0;
    std::map<uint32_t, Parameter> parameters;
    std::vector<Subscription> subscriptions;
    std::optional<Player> player;  // a D channel has one
    uint32_t label = 0;            // the first field of its trace events
    bool played = false;           // the player was started since the trace was switched on

    void subscribe(uint32_t event, const Address& returnTo);
    void cancel(uint32_t event, const Address& returnTo);
    // Ends all subscriptions of the address.
    void forget(const Address& returnTo);

    // The addresses that are subscribed to trace events.
    std::vector<Address> traceTargets() const;
    // Starts the player when the trace parameter is 1 and somebody is subscribed to trace events; stops it
    // when one of the two has ended. A player that has come to its end is not started again until then.
    void updatePlayer(Player::Time now);
};

// The telephony service component of a board.
Component tscComponent(uint8_t board);
// The component of a D channel, which plays the frames.
Component ccsComponent(const DChannel& channel, std::shared_ptr<const Frames> frames);

}  // namespace softboard

#endif
