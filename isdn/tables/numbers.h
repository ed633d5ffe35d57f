// Numbers and subaddresses of parties (Q.931 4.5.8 to 4.5.11, 4.6.7; Q.951, Q.952), and the network to cross.
#ifndef ISDN_TABLES_NUMBERS_H
#define ISDN_TABLES_NUMBERS_H

#include "isdn/readers.h"
#include "isdn/tables/names.h"

namespace isdn::tables {

// clang-format off

// Q.931 4.6.7.
inline constexpr Name redirectingReasons[] = {
    {0, "unknown"},
    {1, "busy"},
    {2, "no reply"},
    {4, "deflected"},
    {9, "called terminal out of order"},
    {10, "by the called terminal"},
    {15, "unconditional"},
};

inline constexpr Row typeAndPlan[] = {
    {"3", bits(7, 5), "type of number", numberTypes},
    {"", bits(4, 1), "numbering plan", numberingPlans},
};
inline constexpr Row presentationAndScreening[] = {
    {"3a", bits(7, 6), "presentation", presentations, extended},
    {"", bits(2, 1), "screening", screenings},
};
inline constexpr Row redirection[] = {
    {"3b", bits(4, 1), "reason for redirection", redirectingReasons, extended},
};
// Octets 3b and 3c of ORIGINAL CALLED NUMBER, which North American switches send.
inline constexpr Name yesOrNo[] = {{0, "no"}, {1, "yes"}};
inline constexpr Row originalRedirection[] = {
    {"3b", bits(4, 1), "first reason for redirection", redirectingReasons, extended},
    {"3c", bits(7, 7), "forwarded on no reply", yesOrNo, extended},
    {"", bits(3, 1), "redirections"},
};
inline constexpr Row digits[] = {
    personal({"4", rest(readCharacters), "digits", {}, optional}),
};

inline constexpr auto calledRows = join(typeAndPlan, digits);
inline constexpr auto callingRows = join(typeAndPlan, presentationAndScreening, digits);
inline constexpr auto redirectingRows = join(typeAndPlan, presentationAndScreening, redirection, digits);
inline constexpr auto originalCalledRows = join(typeAndPlan, presentationAndScreening, originalRedirection, digits);

inline constexpr Name subaddressTypes[] = {{0, "NSAP"}, {2, "user-specified"}};
inline constexpr Name oddOrEven[] = {{0, "even"}, {1, "odd"}};
inline constexpr Row subaddressRows[] = {
    {"3", bits(7, 5), "type of subaddress", subaddressTypes},
    {"", bits(4, 4), "number of digits", oddOrEven},
    personal({"4", rest(readSubaddress), "subaddress", {}, optional}),
};

inline constexpr Name networkTypes[] = {{0, "user-specified"}, {2, "national"}, {3, "international"}};
inline constexpr Name networkPlans[] = {{0, "unknown"}, {1, "carrier identification code"}, {3, "data network"}};
inline constexpr Row transitRows[] = {
    {"3", bits(7, 5), "type of network identification", networkTypes},
    {"", bits(4, 1), "network identification plan", networkPlans},
    {"4", rest(readCharacters), "network", {}, optional},
};

inline constexpr ElementTable numberTables[] = {
    {0, element::calledNumber, "CALLED PARTY NUMBER", "Q.931 4.5.8", calledRows},
    {0, element::callingNumber, "CALLING PARTY NUMBER", "Q.931 4.5.10", callingRows},
    {0, element::connectedNumber, "CONNECTED NUMBER", "Q.951.5 5.4.1", callingRows},
    {0, 0x0C, "CONNECTED NUMBER", "national", callingRows},
    {0, element::redirectingNumber, "REDIRECTING NUMBER", "Q.931 4.6.7", redirectingRows},
    {0, element::redirectionNumber, "REDIRECTION NUMBER", "Q.952", callingRows},
    {0, element::originalCalledNumber, "ORIGINAL CALLED NUMBER", "national", originalCalledRows},
    {0, element::calledSubaddress, "CALLED PARTY SUBADDRESS", "Q.931 4.5.9", subaddressRows},
    {0, element::callingSubaddress, "CALLING PARTY SUBADDRESS", "Q.931 4.5.11", subaddressRows},
    {0, element::connectedSubaddress, "CONNECTED SUBADDRESS", "Q.951.5 5.4.2", subaddressRows},
    {0, 0x75, "REDIRECTING SUBADDRESS", "national", subaddressRows, northAmerica},
    {0, element::transitNetwork, "TRANSIT NETWORK SELECTION", "Q.931 4.5.29", transitRows},
};

// clang-format on

}  // namespace isdn::tables

#endif
