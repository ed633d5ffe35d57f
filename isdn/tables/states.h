// Cause, call state, progress, notification, signals (Q.931 4.5.7, 4.5.12, 4.5.22, 4.5.23, 4.5.28; Q.850).
#ifndef ISDN_TABLES_STATES_H
#define ISDN_TABLES_STATES_H

#include "isdn/readers.h"
#include "isdn/tables/names.h"

namespace isdn::tables {

// clang-format off

inline constexpr Name recommendations[] = {{0, "Q.931"}, {3, "X.21"}, {4, "X.25"}, {5, "Q.1031 or Q.1051"}};

inline constexpr Row causeRows[] = {
    {"3", bits(7, 6), "coding standard", codingStandards},
    {"", bits(4, 1), "location", locationName},
    {"3a", bits(7, 1), "recommendation", recommendations, extended},
    {"4", bits(7, 1), "cause value", causeName, always, false, "Q.850 table 1"},
    {"5", rest(readDiagnostics), "diagnostics", {}, optional},
};

inline constexpr Row callStateRows[] = {
    {"3", bits(8, 7), "coding standard", codingStandards},
    {"", bits(6, 1), "call state", callStateName},
};

inline constexpr Row progressRows[] = {
    {"3", bits(7, 6), "coding standard", codingStandards},
    {"", bits(4, 1), "location", locationName},
    {"4", bits(7, 1), "progress description", progressName},
};

// Values above 2 are those of the supplementary services (Q.951 to Q.957).
inline constexpr Row notificationRows[] = {
    {"3", bits(7, 1), "notification", notificationName},
    {"4", rest(), "further notification", {}, optional},
};

inline constexpr Name signals[] = {
    {0x00, "dial tone on"},
    {0x01, "ring back tone on"},
    {0x02, "intercept tone on"},
    {0x03, "network congestion tone on"},
    {0x04, "busy tone on"},
    {0x05, "confirm tone on"},
    {0x06, "answer tone on"},
    {0x07, "call waiting tone on"},
    {0x08, "off-hook warning tone on"},
    {0x09, "preemption tone on"},
    {0x3F, "tones off"},
    {0x40, "ring, pattern 0"},
    {0x41, "ring, pattern 1"},
    {0x42, "ring, pattern 2"},
    {0x43, "ring, pattern 3"},
    {0x44, "ring, pattern 4"},
    {0x45, "ring, pattern 5"},
    {0x46, "ring, pattern 6"},
    {0x47, "ring, pattern 7"},
    {0x4F, "ringing off"},
};
inline constexpr Row signalRows[] = {{"3", bits(8, 1), "signal", signals}};

// Single-octet elements, whose value is in the identifier.
inline constexpr Name shiftKinds[] = {{0, "locking"}, {1, "for one element"}};
inline constexpr Row shiftRows[] = {
    {"1", heading(8, 5), "identifier"},
    {"", bits(4, 4), "kind of shift", shiftKinds},
    {"", bits(3, 1), "codeset"},
};
inline constexpr Name congestionLevels[] = {{0x0, "receiver ready"}, {0xF, "receiver not ready"}};
inline constexpr Row congestionRows[] = {
    {"1", heading(8, 5), "identifier"},
    {"", bits(4, 1), "congestion level", congestionLevels},
};
inline constexpr Name repetitions[] = {{2, "in order of priority, one to be chosen"}};
inline constexpr Row repeatRows[] = {
    {"1", heading(8, 5), "identifier"},
    {"", bits(4, 1), "meaning of the repetition", repetitions},
};
inline constexpr Row loneRows[] = {{"1", heading(8, 1), "identifier"}};

inline constexpr ElementTable stateTables[] = {
    {0, element::cause, "CAUSE", "Q.850 2.2", causeRows, everywhere, {"3", 7, 6, {0}}},
    {0, element::callState, "CALL STATE", "Q.931 4.5.7", callStateRows, everywhere, {"3", 8, 7, {0}}},
    {0, element::progressIndicator, "PROGRESS INDICATOR", "Q.931 4.5.23", progressRows, everywhere, {"3", 7, 6, {0}}},
    {0, element::notificationIndicator, "NOTIFICATION INDICATOR", "Q.931 4.5.22", notificationRows},
    {0, element::signal, "SIGNAL", "Q.931 4.5.28", signalRows},
    {0, element::moreData, "MORE DATA", "Q.931 4.5.20", loneRows},
    {0, element::sendingComplete, "SENDING COMPLETE", "Q.931 4.5.27", loneRows},
    {0, 0xB0, "CONGESTION LEVEL", "Q.931 4.5.14", congestionRows},
    {0, 0xD0, "REPEAT INDICATOR", "Q.931 4.5.24", repeatRows},
};

// In every codeset.
inline constexpr ElementTable shiftTable{0, 0x90, "SHIFT", "Q.931 4.5.2", shiftRows};

// clang-format on

}  // namespace isdn::tables

#endif
