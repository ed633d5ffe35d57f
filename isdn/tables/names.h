// Names of values that several elements share (Q.931 4.5, Q.850).
#ifndef ISDN_TABLES_NAMES_H
#define ISDN_TABLES_NAMES_H

#include "isdn/Table.h"
#include "isdn/values.h"

namespace isdn::tables {

// clang-format off

// Q.931 4.5.5 and others: bits 7 and 6 of octet 3.
inline constexpr Name codingStandards[] = {
    {0, "ITU-T"},
    {1, "ISO/IEC"},
    {2, "national"},
    {3, "of the network at this location"},
};

// Q.931 4.5.8, 4.5.10.
inline constexpr Name numberTypes[] = {
    {0, "unknown"},
    {1, "international"},
    {2, "national"},
    {3, "network-specific"},
    {4, "subscriber"},
    {6, "abbreviated"},
};

inline constexpr Name numberingPlans[] = {
    {0, "unknown"},
    {1, "ISDN"},
    {3, "data"},
    {4, "telex"},
    {8, "national standard"},
    {9, "private"},
};

// Q.931 4.5.10.
inline constexpr Name presentations[] = {
    {0, "allowed"},
    {1, "restricted"},
    {2, "not available"},
};

inline constexpr Name screenings[] = {
    {0, "by the user, not screened"},
    {1, "by the user, verified and passed"},
    {2, "by the user, verified and failed"},
    {3, "by the network"},
};

// clang-format on

}  // namespace isdn::tables

#endif
