// Elements as values, for programs that compute with them. Every function takes any octets: what is missing
// or contradictory gives no value.
#ifndef ISDN_VALUES_H
#define ISDN_VALUES_H

#include <bitset>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

#include "isdn/Layer3.h"
#include "isdn/octets.h"

namespace isdn {

// CHANNEL IDENTIFICATION (Q.931 4.5.13).
struct ChannelId {
    enum class Selection : std::uint8_t { none, indicated, any };

    Selection selection = Selection::none;
    bool primaryRate = false;                // the interface is not a basic one
    bool exclusive = false;                  // no other channel will do
    bool dChannel = false;                   // the D channel is meant
    bool slotMap = false;                    // coded as a map
    std::optional<std::uint32_t> interface;  // the interface identifier, when it is given explicitly
    std::uint8_t channelType = 0x03;         // 3: B channels
    std::bitset<128> channels;               // those indicated, as coded; on basic access 1 is B1 and 2 is B2
};

std::optional<ChannelId> channelId(const Element& element);

// The channel of a slot map's bit, 8 to 1, of its octet `index` of `octets` (figure 4-21): three octets hold
// the channels 24 to 1, any other number of octets begins with its highest slot and ends with slot 0.
constexpr int slotOf(std::size_t index, unsigned bit, std::size_t octets) {
    constexpr std::size_t octetsOf1544 = 3;
    const int below = static_cast<int>((octets - 1 - index) * 8 + bit);
    return octets == octetsOf1544 ? below : below - 1;
}

// Called, calling, connected, redirecting, redirection and original called numbers (Q.931 4.5.8, 4.5.10 and
// Q.951, EN 300 207).
struct PartyNumber {
    std::uint8_t type = 0;                     // of number, 0 to 7
    std::uint8_t plan = 0;                     // numbering plan, 0 to 15
    std::optional<std::uint8_t> presentation;  // 0 allowed, 1 restricted, 2 not available
    std::optional<std::uint8_t> screening;     // 0 to 3
    std::optional<std::uint8_t> reason;        // of redirection, 0 to 15
    std::string_view digits;                   // as coded, whatever characters they are
    Octets digitOctets;                        // the same, where they stand
};

std::optional<PartyNumber> partyNumber(const Element& element);
// "national", "ISDN"; empty if reserved.
std::string_view numberTypeName(std::uint8_t type);
std::string_view numberingPlanName(std::uint8_t plan);

// The digits of a KEYPAD FACILITY element.
std::string_view keypadDigits(const Element& element);

// CAUSE (Q.850 2). Values have names in `causeName` if the coding standard is 0.
struct Cause {
    std::uint8_t codingStandard = 0;  // 0 ITU-T, 1 ISO/IEC, 2 national, 3 of this location
    std::uint8_t location = 0;        // 0 to 15
    std::optional<std::uint8_t> recommendation;
    std::uint8_t value = 0;  // 1 to 127
    Octets diagnostics;
};

std::optional<Cause> cause(const Element& element);

// "user busy"; empty if the value has no name.
std::string_view causeName(std::uint8_t value);
// "remote public network"; empty if reserved.
std::string_view locationName(std::uint8_t location);

// CALL STATE (Q.931 4.5.7). States are those of the user, 0 to 25, or 61 and 62 of the global reference.
struct CallState {
    std::uint8_t codingStandard = 0;
    std::uint8_t value = 0;
};

std::optional<CallState> callState(const Element& element);
std::string_view callStateName(std::uint8_t value);

// RESTART INDICATOR (Q.931 4.5.25): 0 the channels that are named, 6 one interface, 7 all interfaces.
std::optional<std::uint8_t> restartClass(const Element& element);

// CHANGE STATUS, of codeset 0 or 6 of a SERVICE message: 0 in service, 1 maintenance, 2 out of service.
struct ChangeStatus {
    std::uint8_t status = 0;
    bool channel = false;  // the preference bit: the status is a channel's
};

std::optional<ChangeStatus> changeStatus(const Element& element);

// PROGRESS INDICATOR (Q.931 4.5.23).
struct Progress {
    std::uint8_t codingStandard = 0;
    std::uint8_t location = 0;
    std::uint8_t value = 0;
};

std::optional<Progress> progress(const Element& element);
std::string_view progressName(std::uint8_t value);

// NOTIFICATION INDICATOR (Q.931 4.5.22 and the supplementary services).
std::string_view notificationName(std::uint8_t value);

// SEGMENTED MESSAGE (Q.931 4.5.26): the first element of a SEGMENT.
struct SegmentHeader {
    bool first = false;
    std::uint8_t remaining = 0;    // segments that follow
    std::uint8_t messageType = 0;  // of the message that was cut
};

std::optional<SegmentHeader> segmentHeader(const Element& element);

}  // namespace isdn

#endif
