// Bearer capability (Q.931 4.5.5), and the octets that low layer compatibility shares with it.
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

inline constexpr auto bearerRows = join(bearerHead, modeAndLayer1, bearerTail);

inline constexpr ElementTable bearerTables[] = {
    {0, element::bearerCapability, "BEARER CAPABILITY", "Q.931 4.5.5", bearerRows, everywhere,
     {"3", 7, 6, {0}}, ElementTable::Otherwise::raw},
};

// clang-format on

}  // namespace isdn::tables

#endif
