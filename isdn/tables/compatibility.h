// Low and high layer compatibility (Q.931 4.5.19, 4.5.17).
#ifndef ISDN_TABLES_COMPATIBILITY_H
#define ISDN_TABLES_COMPATIBILITY_H

#include "isdn/tables/bearer.h"

namespace isdn::tables {

// clang-format off

inline constexpr Name sequenceModes[] = {{1, "normal, modulo 8"}, {2, "extended, modulo 128"}};

inline constexpr Name packetSizes[] = {
    {4, "16 octets"},
    {5, "32 octets"},
    {6, "64 octets"},
    {7, "128 octets"},
    {8, "256 octets"},
    {9, "512 octets"},
    {10, "1024 octets"},
    {11, "2048 octets"},
    {12, "4096 octets"},
};

inline constexpr Name outOfBand[] = {{0, "not possible out of band"}, {1, "possible out of band"}};

inline constexpr Row compatibilityHead[] = {
    {"3", bits(7, 6), "coding standard", codingStandards},
    {"", bits(5, 1), "information transfer capability", transferCapabilities},
    {"3a", bits(7, 7), "negotiation", outOfBand, extended},
};

// What octets 6a to 7c hold follows from the protocols of octets 6 and 7.
inline constexpr When ofUserLayer2 = ifSeen("6", 5, 1, {0x10});
inline constexpr When ofStandardLayer2 = ifSeen("6", 5, 1, {1, 2, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 17});
inline constexpr When ofUserLayer3 = ifSeen("7", 5, 1, {0x10});
inline constexpr When ofPacketLayer3 = ifSeen("7", 5, 1, {6, 7, 8});
inline constexpr When ofNamedLayer3 = ifSeen("7", 5, 1, {0x0B});

inline constexpr Row compatibilityTail[] = {
    {"6", bits(7, 6), "layer", layerIdentities, ifNext(7, 6, {2})},
    {"", bits(5, 1), "layer 2 protocol", layer2Protocols},
    {"6a", bits(7, 6), "mode of operation", sequenceModes, extended & ofStandardLayer2},
    {"", bits(2, 1), "use of Q.933"},
    {"6a", bits(7, 1), "user's layer 2 protocol", {}, extended & ofUserLayer2},
    {"6b", bits(7, 1), "window size", {}, extended & ofStandardLayer2},
    {"7", bits(7, 6), "layer", layerIdentities, ifNext(7, 6, {3})},
    {"", bits(5, 1), "layer 3 protocol", layer3Protocols},
    {"7a", bits(7, 6), "mode of operation", sequenceModes, extended & ofPacketLayer3},
    {"7b", bits(4, 1), "default packet size", packetSizes, extended & ofPacketLayer3},
    {"7c", bits(7, 1), "packet window size", {}, extended & ofPacketLayer3},
    {"7a", bits(7, 1), "user's layer 3 protocol", {}, extended & ofUserLayer3},
    {"7a", bits(4, 1), "further layer 3 protocol, upper bits", {}, extended & ofNamedLayer3},
    {"7b", bits(4, 1), "further layer 3 protocol, lower bits", {}, extended & ofNamedLayer3},
};

inline constexpr auto compatibilityRows = join(compatibilityHead, modeAndLayer1, compatibilityTail);

inline constexpr Name interpretations[] = {{4, "first, or only, one of the call"}};
inline constexpr Name profiles[] = {{1, "high layer protocol profile"}};

inline constexpr Name highLayers[] = {
    {0x01, "telephony"},
    {0x04, "facsimile group 2 or 3"},
    {0x21, "facsimile group 4, class I"},
    {0x24, "teletex, mixed mode; facsimile group 4, classes II and III"},
    {0x28, "teletex, processable mode"},
    {0x31, "teletex, basic mode"},
    {0x32, "videotex, syntax-based"},
    {0x33, "videotex, international"},
    {0x35, "telex"},
    {0x38, "message handling"},
    {0x41, "OSI application"},
    {0x42, "file transfer (FTAM)"},
    {0x5E, "maintenance"},
    {0x5F, "management"},
    {0x60, "video telephony"},
    {0x61, "video conference"},
    {0x62, "audiographic conference"},
    {0x68, "multimedia"},
};

inline constexpr Name audiovisual[] = {
    {0x01, "H.221, first channel"},
    {0x02, "H.221, further channel"},
    {0x21, "first channel of a call that was speech or 3.1 kHz audio"},
};

inline constexpr Row highLayerRows[] = {
    {"3", bits(7, 6), "coding standard", codingStandards},
    {"", bits(5, 3), "interpretation", interpretations},
    {"", bits(2, 1), "presentation of the profile", profiles},
    {"4", bits(7, 1), "high layer characteristics", highLayers},
    {"4a", bits(7, 1), "further characteristics", highLayers, extended & ifSeen("4", 7, 2, {0x2F})},
    {"4a", bits(7, 1), "further characteristics", audiovisual, extended},
};

inline constexpr ElementTable compatibilityTables[] = {
    {0, element::lowLayerCompatibility, "LOW LAYER COMPATIBILITY", "Q.931 4.5.19", compatibilityRows, everywhere,
     {"3", 7, 6, {0}}, ElementTable::Otherwise::raw},
    {0, element::highLayerCompatibility, "HIGH LAYER COMPATIBILITY", "Q.931 4.5.17", highLayerRows, everywhere,
     {"3", 7, 6, {0}}, ElementTable::Otherwise::raw},
};

// clang-format on

}  // namespace isdn::tables

#endif
