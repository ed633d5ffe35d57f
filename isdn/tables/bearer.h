// Bearer capability and the compatibility elements (Q.931 4.5.5, 4.5.17, 4.5.19).
#ifndef ISDN_TABLES_BEARER_H
#define ISDN_TABLES_BEARER_H

#include "isdn/tables/names.h"

namespace isdn::tables {

// clang-format off

inline constexpr Name transferCapabilities[] = {
    {0x00, "speech"},
    {0x08, "unrestricted digital"},
    {0x09, "restricted digital"},
    {0x10, "3.1 kHz audio"},
    {0x11, "unrestricted digital with tones"},
    {0x18, "video"},
};

inline constexpr Name transferModes[] = {
    {0, "circuit"},
    {2, "packet"},
};

inline constexpr Name transferRates[] = {
    {0x00, "packet"},
    {0x10, "64 kbit/s"},
    {0x11, "2 x 64 kbit/s"},
    {0x13, "384 kbit/s"},
    {0x15, "1536 kbit/s"},
    {0x17, "1920 kbit/s"},
    {0x18, "multiple of 64 kbit/s"},
};

// Octets 4a and 4b of Q.931 of 1993; later editions dropped them.
inline constexpr Name structures[] = {
    {0, "default"},
    {1, "8 kHz integrity"},
    {4, "service data units kept"},
    {7, "unstructured"},
};
inline constexpr Name configurations[] = {{0, "point to point"}};
inline constexpr Name establishments[] = {{0, "on demand"}};
inline constexpr Name symmetries[] = {{0, "the same in both directions"}};

inline constexpr Name layerIdentities[] = {{1, "layer 1"}, {2, "layer 2"}, {3, "layer 3"}};

inline constexpr Name layer1Protocols[] = {
    {1, "V.110 rate adaption"},
    {2, "mu-law"},
    {3, "A-law"},
    {4, "32 kbit/s ADPCM"},
    {5, "H.221 and H.242"},
    {6, "H.223 and H.245"},
    {7, "rate adaption of another standard"},
    {8, "V.120 rate adaption"},
    {9, "X.31 flag stuffing"},
};

inline constexpr Name synchronizations[] = {{0, "synchronous"}, {1, "asynchronous"}};
inline constexpr Name negotiations[] = {{0, "not possible in band"}, {1, "possible in band"}};

inline constexpr Name userRates[] = {
    {0x00, "by the E bits, or in band"},
    {0x01, "0.6 kbit/s"},
    {0x02, "1.2 kbit/s"},
    {0x03, "2.4 kbit/s"},
    {0x04, "3.6 kbit/s"},
    {0x05, "4.8 kbit/s"},
    {0x06, "7.2 kbit/s"},
    {0x07, "8 kbit/s"},
    {0x08, "9.6 kbit/s"},
    {0x09, "14.4 kbit/s"},
    {0x0A, "16 kbit/s"},
    {0x0B, "19.2 kbit/s"},
    {0x0C, "32 kbit/s"},
    {0x0E, "48 kbit/s"},
    {0x0F, "56 kbit/s"},
    {0x10, "64 kbit/s"},
    {0x15, "134.5 bit/s"},
    {0x16, "100 bit/s"},
    {0x17, "75 bit/s one way, 1200 bit/s back"},
    {0x18, "1200 bit/s one way, 75 bit/s back"},
    {0x19, "50 bit/s"},
    {0x1A, "75 bit/s"},
    {0x1B, "110 bit/s"},
    {0x1C, "150 bit/s"},
    {0x1D, "200 bit/s"},
    {0x1E, "300 bit/s"},
    {0x1F, "12 kbit/s"},
};

inline constexpr Name intermediateRates[] = {{0, "not used"}, {1, "8 kbit/s"}, {2, "16 kbit/s"}, {3, "32 kbit/s"}};
inline constexpr Name needed[] = {{0, "not required"}, {1, "required"}};
inline constexpr Name accepted[] = {{0, "not accepted"}, {1, "accepted"}};
inline constexpr Name included[] = {{0, "not included"}, {1, "included"}};
inline constexpr Name supported[] = {{0, "not supported"}, {1, "supported"}};
inline constexpr Name operations[] = {{0, "bit transparent"}, {1, "protocol sensitive"}};
inline constexpr Name linkIdentifiers[] = {{0, "LLI is 256"}, {1, "all values"}};
inline constexpr Name assignors[] = {{0, "assignee"}, {1, "assignor"}};
inline constexpr Name negotiatedBy[] = {{0, "user information messages"}, {1, "logical link zero"}};

inline constexpr Name stopBits[] = {{0, "not used"}, {1, "1"}, {2, "1.5"}, {3, "2"}};
inline constexpr Name dataBits[] = {{0, "not used"}, {1, "5"}, {2, "7"}, {3, "8"}};
inline constexpr Name parities[] = {{0, "odd"}, {2, "even"}, {3, "none"}, {4, "forced to 0"}, {5, "forced to 1"}};
inline constexpr Name duplexes[] = {{0, "half duplex"}, {1, "full duplex"}};

inline constexpr Name modems[] = {
    {0x11, "V.21"},
    {0x12, "V.22"},
    {0x13, "V.22 bis"},
    {0x14, "V.23"},
    {0x15, "V.26"},
    {0x16, "V.26 bis"},
    {0x17, "V.26 ter"},
    {0x18, "V.27"},
    {0x19, "V.27 bis"},
    {0x1A, "V.27 ter"},
    {0x1B, "V.29"},
    {0x1C, "V.32"},
    {0x1D, "V.32"},
    {0x1E, "V.34"},
};

inline constexpr Name layer2Protocols[] = {
    {0x01, "basic mode ISO 1745"},
    {0x02, "Q.921"},
    {0x06, "X.25 single link"},
    {0x07, "X.25 multilink"},
    {0x08, "T.71 extended LAPB"},
    {0x09, "HDLC ARM"},
    {0x0A, "HDLC NRM"},
    {0x0B, "HDLC ABM"},
    {0x0C, "LAN logical link control"},
    {0x0D, "X.75 single link"},
    {0x0E, "Q.922"},
    {0x0F, "core of Q.922"},
    {0x10, "user-specified"},
    {0x11, "ISO/IEC 7776 DTE to DTE"},
};

inline constexpr Name layer3Protocols[] = {
    {0x02, "Q.931"},
    {0x06, "X.25 packet layer"},
    {0x07, "ISO/IEC 8208"},
    {0x08, "X.223"},
    {0x09, "ISO/IEC 8473"},
    {0x0A, "T.70 minimum"},
    {0x0B, "ISO/IEC TR 9577"},
    {0x10, "user-specified"},
};

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

inline constexpr When ofV120 = ifSeen("5", 5, 1, {8});
inline constexpr When notOfV120 = ifSeen("5", 5, 1, {0, 1, 2, 3, 4, 5, 6, 7, 9, 10, 11, 12, 13, 14, 15});

// Octets 4 to 5d of both elements. Octet 5b has one form for V.110 and its like, another for V.120.
inline constexpr Row modeAndLayer1[] = {
    {"4", bits(7, 6), "transfer mode", transferModes},
    {"", bits(5, 1), "information transfer rate", transferRates},
    {"4a", bits(7, 5), "structure", structures, extended},
    {"", bits(4, 3), "configuration", configurations},
    {"", bits(2, 1), "establishment", establishments},
    {"4b", bits(7, 6), "symmetry", symmetries, extended},
    {"", bits(5, 1), "information transfer rate back", transferRates},
    {"4.1", bits(7, 1), "rate multiplier", {}, ifSeen("4", 5, 1, {0x18})},
    {"5", bits(7, 6), "layer", layerIdentities, ifNext(7, 6, {1})},
    {"", bits(5, 1), "layer 1 protocol", layer1Protocols},
    {"5a", bits(7, 7), "synchronization", synchronizations, extended},
    {"", bits(6, 6), "negotiation", negotiations},
    {"", bits(5, 1), "user rate", userRates},
    {"5b", bits(7, 6), "intermediate rate", intermediateRates, extended & notOfV120},
    {"", bits(5, 5), "network independent clock, sending", needed},
    {"", bits(4, 4), "network independent clock, receiving", accepted},
    {"", bits(3, 3), "flow control, sending", needed},
    {"", bits(2, 2), "flow control, receiving", accepted},
    {"5b", bits(7, 7), "rate adaption header", included, extended & ofV120},
    {"", bits(6, 6), "multiple frame establishment", supported},
    {"", bits(5, 5), "mode of operation", operations},
    {"", bits(4, 4), "logical link identifier", linkIdentifiers},
    {"", bits(3, 3), "assignor", assignors},
    {"", bits(2, 2), "negotiated by", negotiatedBy},
    {"5c", bits(7, 6), "stop bits", stopBits, extended},
    {"", bits(5, 4), "data bits", dataBits},
    {"", bits(3, 1), "parity", parities},
    {"5d", bits(7, 7), "duplex mode", duplexes, extended},
    {"", bits(6, 1), "modem type", modems},
};

inline constexpr Row bearerHead[] = {
    {"3", bits(7, 6), "coding standard", codingStandards},
    {"", bits(5, 1), "information transfer capability", transferCapabilities},
};

inline constexpr Row bearerTail[] = {
    {"6", bits(7, 6), "layer", layerIdentities, ifNext(7, 6, {2})},
    {"", bits(5, 1), "layer 2 protocol", layer2Protocols},
    {"7", bits(7, 6), "layer", layerIdentities, ifNext(7, 6, {3})},
    {"", bits(5, 1), "layer 3 protocol", layer3Protocols},
    {"7a", bits(4, 1), "further layer 3 protocol, upper bits", {}, extended},
    {"7b", bits(4, 1), "further layer 3 protocol, lower bits", {}, extended},
};

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

inline constexpr auto bearerRows = join(bearerHead, modeAndLayer1, bearerTail);
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

inline constexpr ElementTable bearerTables[] = {
    {0, element::bearerCapability, "BEARER CAPABILITY", "Q.931 4.5.5", bearerRows, everywhere,
     {"3", 7, 6, {0}}, ElementTable::Otherwise::raw},
    {0, element::lowLayerCompatibility, "LOW LAYER COMPATIBILITY", "Q.931 4.5.19", compatibilityRows, everywhere,
     {"3", 7, 6, {0}}, ElementTable::Otherwise::raw},
    {0, element::highLayerCompatibility, "HIGH LAYER COMPATIBILITY", "Q.931 4.5.17", highLayerRows, everywhere,
     {"3", 7, 6, {0}}, ElementTable::Otherwise::raw},
};

// clang-format on

}  // namespace isdn::tables

#endif
