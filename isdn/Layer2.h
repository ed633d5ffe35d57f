// The link header of a frame: address and control fields (Q.921 3.2 to 3.6).
#ifndef ISDN_LAYER2_H
#define ISDN_LAYER2_H

#include <cstdint>
#include <string_view>

#include "isdn/octets.h"

namespace isdn {

// The types of Q.921 table 5, and SABM of its ancestor (LAPB), which some equipment still sends.
enum class FrameType : std::uint8_t { I, RR, RNR, REJ, SABME, SABM, DM, UI, DISC, UA, FRMR, XID, UNKNOWN };

// "I", "RR", ...
std::string_view nameOf(FrameType type);

inline constexpr std::uint8_t callControlSapi = 0;
inline constexpr std::uint8_t packetSapi = 16;
inline constexpr std::uint8_t managementSapi = 63;
inline constexpr std::uint8_t groupTei = 127;

// A view of a frame, from the first octet of the address on, without its check sequence. Any octets can be
// parsed; fields that are missing are 0, and `problem` says so. Parsing allocates nothing.
struct Layer2 {
    Octets octets;       // the frame
    Octets header;       // address and control field, as far as they are there
    Octets information;  // what follows them
    FrameType type = FrameType::UNKNOWN;
    Problem problem = Problem::none;
    std::uint8_t sapi = 0;  // 0 to 63
    std::uint8_t tei = 0;   // 0 to 127
    std::uint8_t ns = 0;    // N(S), 0 to 127; of I frames
    std::uint8_t nr = 0;    // N(R), 0 to 127; of I frames, RR, RNR and REJ
    bool cr = false;        // the command/response bit as coded
    bool pf = false;        // poll or final bit

    bool hasNs() const { return type == FrameType::I; }
    bool hasNr() const { return type <= FrameType::REJ; }
    bool hasPf() const { return header.size() > 2 && type != FrameType::UNKNOWN; }

    // An I or UI frame of call control: its information is a layer-3 message.
    bool carriesMessage() const {
        return (type == FrameType::I || type == FrameType::UI) && sapi == callControlSapi &&
               !information.empty();
    }
    // A UI frame of layer management: its information is a TEI message (Q.921 5.3).
    bool carriesTeiMessage() const {
        return type == FrameType::UI && sapi == managementSapi && !information.empty();
    }
};

Layer2 parseLayer2(Octets frame);

// Whether a frame with this C/R bit is a command, when the role of its sender is known (Q.921 3.3.2).
// Commands of the network and responses of the user have the bit set.
constexpr bool isCommand(bool cr, bool sentByNetwork) { return cr == sentByNetwork; }

// SABME, DISC, I and UI are always commands, UA, DM and FRMR always responses; the others may be either.
constexpr bool alwaysCommand(FrameType type) {
    using enum FrameType;
    return type == I || type == UI || type == SABME || type == SABM || type == DISC;
}
constexpr bool alwaysResponse(FrameType type) {
    using enum FrameType;
    return type == DM || type == UA || type == FRMR;
}

// What a frame reject says (Q.921 3.6.11, octets 5 to 9 of the frame).
struct FrameReject {
    Octets octets;
    std::uint8_t rejectedControl[2] = {0, 0};  // the control field of the rejected frame
    std::uint8_t vs = 0;                       // V(S) of the sender of FRMR
    std::uint8_t vr = 0;                       // V(R)
    bool response = false;                     // the rejected frame was a response
    bool undefinedControl = false;             // W: the control field is not known or not implemented
    bool informationNotPermitted = false;  // X: an information field where none belongs, or a wrong length
    bool informationTooLong = false;       // Y: the information field is longer than N201
    bool invalidNr = false;                // Z: N(R) acknowledges what was not sent
    Problem problem = Problem::none;
};

FrameReject parseFrameReject(Octets information);

// A message of TEI management (Q.921 5.3, table 8): its layer management entity, reference number and action.
struct TeiMessage {
    Octets octets;
    std::uint8_t entity = 0;      // management entity identifier; 0x0F
    std::uint16_t reference = 0;  // Ri
    std::uint8_t type = 0;        // 1 to 7
    std::uint8_t action = 0;      // Ai of the first action octet: a TEI, or 127 for any
    Octets actions;               // every action octet; more than one in a check response
    Problem problem = Problem::none;
};

TeiMessage parseTeiMessage(Octets information);

// "identity request", "identity assigned", ...; empty for an unknown type.
std::string_view teiMessageName(std::uint8_t type);

}  // namespace isdn

#endif
