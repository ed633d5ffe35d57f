// A layer-3 message as the state machines take it.
#ifndef CALLS_MESSAGE_H
#define CALLS_MESSAGE_H

#include <cstdint>

#include "capture/Frame.h"
#include "isdn/Layer2.h"
#include "isdn/Layer3.h"
#include "isdn/Variant.h"
#include "isdn/words.h"

namespace calls {

// Which end of the link: ours, whose frames count as transmitted, or the other one.
enum class Side : std::uint8_t { us, peer };
constexpr Side other(Side side) { return side == Side::us ? Side::peer : Side::us; }

constexpr capture::Role opposite(capture::Role role) {
    using enum capture::Role;
    return role == user ? network : role == network ? user : unknown;
}

inline constexpr std::int64_t millisecond = 1'000'000;
inline constexpr std::int64_t second = 1'000 * millisecond;

// A message that the receiver's layer 2 accepts, so no duplicate and none out of sequence. A message that was
// sent in segments comes once, put together, with the last of its frames. The views in it are valid only
// during the call that hands it over.
struct Message {
    const capture::Frame* frame = nullptr;
    std::uint64_t number = 0;  // the frame's number in the input, from 1
    // Nanoseconds on the clock of this D channel, which never goes back. A duration is the difference of two
    // of these.
    std::int64_t at = 0;
    // number of the D channel, or of the group of D channels that share their calls (NFAS)
    std::uint32_t group = 0;
    capture::Role role = capture::Role::unknown;  // the role of our side, as the link's frames have shown it
    // Another number whenever N(S) and N(R) of the link begin again, so that numbers of frames before and
    // after that are not compared.
    std::uint64_t numbering = 0;
    isdn::Layer2 layer2;
    isdn::Layer3 layer3;
    isdn::Variant variant = isdn::Variant::net5;

    Side from() const { return frame->transmitted ? Side::us : Side::peer; }
    // The role of the side that sent the message.
    capture::Role senderRole() const { return from() == Side::us ? role : opposite(role); }
    isdn::Sender sender() const {
        const capture::Role sends = senderRole();
        return sends == capture::Role::user      ? isdn::Sender::user
               : sends == capture::Role::network ? isdn::Sender::network
                                                 : isdn::Sender::unknown;
    }
};

// DISCONNECT, RELEASE or RELEASE COMPLETE (Q.931 5.3).
constexpr bool isClearing(std::uint8_t messageType) {
    namespace type = isdn::message;
    return messageType == type::disconnect || messageType == type::release ||
           messageType == type::releaseComplete;
}

}  // namespace calls

#endif
