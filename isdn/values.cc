#include "isdn/values.h"

#include <algorithm>

#include "isdn/Table.h"

namespace isdn {

namespace {

constexpr std::uint8_t standardOf(std::uint8_t octet) { return bitsOf(octet, 7, 6); }

bool is(const Element& element, std::uint8_t id, std::uint8_t codeset = 0) {
    return element.id == id && element.codeset == codeset && !element.octets.empty();
}

constexpr bool goesOn(std::uint8_t octet) { return (octet & 0x80U) == 0; }

// How many octets of its group an element's number may have before its digits, octet 3 included.
unsigned groupSize(std::uint8_t id) {
    constexpr std::uint8_t connectedNumberOfOld = 0x0C;
    switch (id) {
        case element::calledNumber:
            return 1;
        case element::callingNumber:
        case element::connectedNumber:
        case connectedNumberOfOld:
        case element::redirectionNumber:
            return 2;
        case element::redirectingNumber:
            return 3;
        case element::originalCalledNumber:
            return 4;
        default:
            return 0;
    }
}

// The number of octets of a group that no table knows: up to the next one with bit 8 set, if it is near. The
// engine skips the same octets.
std::size_t unknownExtensions(Octets rest) {
    constexpr std::size_t most = 4;
    for (std::size_t i = 0; i < std::min(rest.size(), most); ++i) {
        if (!goesOn(rest[i]))
            return i + 1;
    }
    return 0;
}

// The octets after a group. The first of `octets` is the last octet of the group that is known.
Octets behindGroup(Octets octets) {
    const Octets rest = octets.subspan(1);
    return goesOn(octets[0]) ? rest.subspan(unknownExtensions(rest)) : rest;
}

void addNumbers(ChannelId& channel, Octets numbers) {
    for (const std::uint8_t octet : numbers) {
        channel.channels.set(octet & 0x7FU);
        if (!goesOn(octet))
            return;
    }
}

void addSlots(ChannelId& channel, Octets map) {
    for (std::size_t i = 0; i < map.size(); ++i) {
        for (unsigned bit = 1; bit <= 8; ++bit) {
            const int slot = slotOf(i, bit, map.size());
            if (bitsOf(map[i], bit, bit) != 0 && slot >= 0 && slot < 128)
                channel.channels.set(static_cast<std::size_t>(slot));
        }
    }
}

// Octets 3.1: the interface, seven bits an octet. Returns what follows.
Octets takeInterface(ChannelId& channel, Octets rest) {
    std::uint32_t interface = 0;
    std::size_t taken = 0;
    while (taken < rest.size()) {
        const std::uint8_t octet = rest[taken++];
        interface = interface << 7 | (octet & 0x7FU);
        if (!goesOn(octet))
            break;
    }
    if (taken != 0)
        channel.interface = interface;
    return rest.subspan(taken);
}

}  // namespace

std::optional<ChannelId> channelId(const Element& element) {
    if (!is(element, element::channelIdentification) || element.contents.empty())
        return std::nullopt;
    const std::uint8_t octet3 = element.contents[0];
    const unsigned selection = octet3 & 3U;
    ChannelId channel;
    channel.primaryRate = (octet3 & 0x20U) != 0;
    channel.exclusive = (octet3 & 0x08U) != 0;
    channel.dChannel = (octet3 & 0x04U) != 0;
    if (selection == 3)
        channel.selection = ChannelId::Selection::any;
    else if (selection != 0)
        channel.selection = ChannelId::Selection::indicated;
    Octets rest = behindGroup(element.contents);
    if ((octet3 & 0x40U) != 0)
        rest = takeInterface(channel, rest);
    if (!channel.primaryRate) {
        if (channel.selection == ChannelId::Selection::indicated)
            channel.channels.set(selection);
        return channel;
    }
    if (channel.selection != ChannelId::Selection::indicated || rest.empty())
        return channel;
    channel.slotMap = (rest[0] & 0x10U) != 0;
    channel.channelType = rest[0] & 0x0FU;
    if (channel.slotMap)
        addSlots(channel, behindGroup(rest));
    else
        addNumbers(channel, behindGroup(rest));
    return channel;
}

std::optional<PartyNumber> partyNumber(const Element& element) {
    const unsigned known = element.codeset == 0 ? groupSize(element.id) : 0;
    if (known == 0 || element.contents.empty())
        return std::nullopt;
    const Octets contents = element.contents;
    PartyNumber number;
    number.type = bitsOf(contents[0], 7, 5);
    number.plan = contents[0] & 0x0FU;
    std::size_t taken = 1;
    while (taken < known && goesOn(contents[taken - 1]) && taken < contents.size()) {
        const std::uint8_t octet = contents[taken++];
        if (taken == 2) {
            number.presentation = bitsOf(octet, 7, 6);
            number.screening = octet & 3U;
        } else if (taken == 3) {
            number.reason = octet & 0x0FU;
        }
    }
    if (goesOn(contents[taken - 1]))
        taken += unknownExtensions(contents.subspan(taken));
    number.digitOctets = contents.subspan(taken);
    number.digits = asCharacters(number.digitOctets);
    return number;
}

std::string_view keypadDigits(const Element& element) {
    return is(element, element::keypad) ? asCharacters(element.contents) : std::string_view();
}

std::optional<Cause> cause(const Element& element) {
    if (!is(element, element::cause) || element.contents.size() < 2)
        return std::nullopt;
    const Octets contents = element.contents;
    Cause cause;
    cause.codingStandard = standardOf(contents[0]);
    cause.location = contents[0] & 0x0FU;
    std::size_t at = 1;
    if (goesOn(contents[0])) {
        cause.recommendation = contents[at++] & 0x7FU;
        if (goesOn(contents[at - 1]))
            at += unknownExtensions(contents.subspan(at));
    }
    if (at >= contents.size())
        return std::nullopt;
    cause.value = contents[at] & 0x7FU;
    cause.diagnostics = behindGroup(contents.subspan(at));
    return cause;
}

std::optional<CallState> callState(const Element& element) {
    if (!is(element, element::callState) || element.contents.empty())
        return std::nullopt;
    const std::uint8_t octet = element.contents[0];
    return CallState{bitsOf(octet, 8, 7), bitsOf(octet, 6, 1)};
}

std::optional<std::uint8_t> restartClass(const Element& element) {
    if (!is(element, element::restartIndicator) || element.contents.empty())
        return std::nullopt;
    return element.contents[0] & 7U;
}

std::optional<ChangeStatus> changeStatus(const Element& element) {
    const bool here = is(element, element::changeStatus) || is(element, element::changeStatus, 6);
    if (!here || !element.ofService || element.contents.empty())
        return std::nullopt;
    return ChangeStatus{bitsOf(element.contents[0], 3, 1), bitsOf(element.contents[0], 7, 7) != 0};
}

std::optional<Progress> progress(const Element& element) {
    if (!is(element, element::progressIndicator) || element.contents.size() < 2)
        return std::nullopt;
    const std::uint8_t octet3 = element.contents[0];
    const Octets rest = behindGroup(element.contents);
    if (rest.empty())
        return std::nullopt;
    return Progress{standardOf(octet3), static_cast<std::uint8_t>(octet3 & 0x0FU),
                    static_cast<std::uint8_t>(rest[0] & 0x7FU)};
}

std::optional<SegmentHeader> segmentHeader(const Element& element) {
    if (!is(element, element::segmentedMessage) || element.contents.size() < 2)
        return std::nullopt;
    return SegmentHeader{(element.contents[0] & 0x80U) != 0,
                         static_cast<std::uint8_t>(element.contents[0] & 0x7FU), element.contents[1]};
}

}  // namespace isdn
