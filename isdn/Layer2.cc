#include "isdn/Layer2.h"

#include <array>

namespace isdn {

namespace {

using enum FrameType;

// Control octets without their P/F bit (Q.921 table 5).
constexpr FrameType unnumbered(std::uint8_t control) {
    switch (control & 0xEFU) {
        case 0x6F:
            return SABME;
        case 0x2F:
            return SABM;
        case 0x0F:
            return DM;
        case 0x03:
            return UI;
        case 0x43:
            return DISC;
        case 0x63:
            return UA;
        case 0x87:
            return FRMR;
        case 0xAF:
            return XID;
        default:
            return UNKNOWN;
    }
}

// Bits 8 to 5 of a supervisory frame's first control octet are reserved; a receiver ignores them.
constexpr FrameType supervisory(std::uint8_t control) {
    constexpr FrameType types[] = {RR, RNR, REJ, UNKNOWN};
    return types[(control >> 2) & 3U];
}

constexpr FrameType typeOf(std::uint8_t control) {
    if ((control & 1U) == 0)
        return I;
    return (control & 2U) == 0 ? supervisory(control) : unnumbered(control);
}

consteval std::array<FrameType, 256> typesByControl() {
    std::array<FrameType, 256> types{};
    for (unsigned control = 0; control < types.size(); ++control)
        types[control] = typeOf(static_cast<std::uint8_t>(control));
    return types;
}

constexpr std::array<FrameType, 256> frameTypes = typesByControl();

constexpr unsigned addressOctets = 2;

// The control field of I and supervisory frames has two octets, of unnumbered ones a single octet.
void parseControl(Layer2& frame) {
    const Octets control = frame.octets.subspan(addressOctets);
    frame.type = frameTypes[control[0]];
    if ((control[0] & 3U) == 3U) {
        frame.pf = (control[0] & 0x10U) != 0;
        frame.header = frame.octets.first(addressOctets + 1);
        frame.information = control.subspan(1);
        return;
    }
    if (control.size() < 2) {
        frame.problem = Problem::truncated;
        frame.header = frame.octets;
        return;
    }
    frame.ns = frame.type == I ? control[0] >> 1 : 0;
    frame.nr = control[1] >> 1;
    frame.pf = (control[1] & 1U) != 0;
    frame.header = frame.octets.first(addressOctets + 2);
    frame.information = control.subspan(2);
}

}  // namespace

std::string_view nameOf(FrameType type) {
    constexpr std::string_view names[] = {"I",  "RR",   "RNR", "REJ",  "SABME", "SABM",   "DM",
                                          "UI", "DISC", "UA",  "FRMR", "XID",   "UNKNOWN"};
    return names[static_cast<unsigned>(type)];
}

Layer2 parseLayer2(Octets octets) {
    Layer2 frame;
    frame.octets = octets;
    if (!octets.empty()) {
        frame.sapi = octets[0] >> 2;
        frame.cr = (octets[0] & 2U) != 0;
    }
    if (octets.size() <= addressOctets) {
        if (octets.size() == addressOctets)
            frame.tei = octets[1] >> 1;
        frame.header = octets;
        frame.problem = Problem::truncated;
        return frame;
    }
    frame.tei = octets[1] >> 1;
    parseControl(frame);
    // The address ends with its second octet: bit 1 is clear in the first and set in the second (Q.921 3.2).
    const bool addressOfTwo = (octets[0] & 1U) == 0 && (octets[1] & 1U) != 0;
    if (!addressOfTwo && frame.problem == Problem::none)
        frame.problem = Problem::invalid;
    else if (frame.type == UNKNOWN && frame.problem == Problem::none)
        frame.problem = Problem::unknown;
    return frame;
}

FrameReject parseFrameReject(Octets information) {
    constexpr unsigned size = 5;
    FrameReject reject;
    reject.octets = information;
    const auto at = [&](unsigned i) -> unsigned { return i < information.size() ? information[i] : 0U; };
    reject.rejectedControl[0] = static_cast<std::uint8_t>(at(0));
    reject.rejectedControl[1] = static_cast<std::uint8_t>(at(1));
    reject.vs = static_cast<std::uint8_t>(at(2) >> 1);
    reject.vr = static_cast<std::uint8_t>(at(3) >> 1);
    reject.response = (at(3) & 1U) != 0;
    reject.undefinedControl = (at(4) & 1U) != 0;
    reject.informationNotPermitted = (at(4) & 2U) != 0;
    reject.informationTooLong = (at(4) & 4U) != 0;
    reject.invalidNr = (at(4) & 8U) != 0;
    if (information.size() < size)
        reject.problem = Problem::tooShort;
    else if (information.size() > size)
        reject.problem = Problem::tooLong;
    return reject;
}

TeiMessage parseTeiMessage(Octets information) {
    constexpr unsigned size = 5;
    constexpr unsigned header = 4;
    TeiMessage message;
    message.octets = information;
    const auto at = [&](unsigned i) -> unsigned { return i < information.size() ? information[i] : 0U; };
    message.entity = static_cast<std::uint8_t>(at(0));
    message.reference = static_cast<std::uint16_t>(at(1) << 8 | at(2));
    message.type = static_cast<std::uint8_t>(at(3));
    message.action = static_cast<std::uint8_t>(at(4) >> 1);
    if (information.size() < size) {
        message.problem = Problem::tooShort;
        return message;
    }
    // Bit 1 of an action octet is set in the last of them (Q.921 5.3.4).
    unsigned last = header;
    while (last + 1 < information.size() && (information[last] & 1U) == 0)
        ++last;
    message.actions = information.subspan(header, last + 1 - header);
    if (last + 1 < information.size())
        message.problem = Problem::tooLong;
    else if ((information[last] & 1U) == 0)
        message.problem = Problem::truncated;
    if (teiMessageName(message.type).empty())
        message.problem = Problem::unknown;
    return message;
}

// Q.921 table 8.
std::string_view teiMessageName(std::uint8_t type) {
    constexpr std::string_view names[] = {"",
                                          "identity request",
                                          "identity assigned",
                                          "identity denied",
                                          "identity check request",
                                          "identity check response",
                                          "identity remove",
                                          "identity verify"};
    return type < std::size(names) ? names[type] : std::string_view();
}

}  // namespace isdn
