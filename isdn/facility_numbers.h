// Functions with which the types of facility arguments are declared, and the types that several services use.
#ifndef ISDN_FACILITY_NUMBERS_H
#define ISDN_FACILITY_NUMBERS_H

#include "isdn/ber_types.h"

namespace isdn::facility {

using Kind = BerType::Kind;
using Tagging = BerMember::Tagging;
using Words = BerMember::Words;

// A member with its type's own tag; with a context tag instead of that tag (implicit); with a context tag
// around the tagged value (explicit).
constexpr BerMember plain(std::string_view name, const BerType& type, Words words = Words::named) {
    return {name, &type, Tagging::none, 0, words};
}
constexpr BerMember instead(std::uint32_t tag, std::string_view name, const BerType& type,
                            Words words = Words::named) {
    return {name, &type, Tagging::implicit, tag, words};
}
constexpr BerMember around(std::uint32_t tag, std::string_view name, const BerType& type,
                           Words words = Words::named) {
    return {name, &type, Tagging::explicitly, tag, words};
}
constexpr BerType sequence(std::span<const BerMember> members) { return {Kind::sequence, members}; }
constexpr BerType list(std::span<const BerMember> member) { return {Kind::sequenceOf, member}; }
constexpr BerType choice(std::span<const BerMember> members) { return {Kind::choice, members}; }
constexpr BerType enumerated(std::span<const BerName> names) { return {Kind::enumerated, {}, names}; }

inline constexpr BerType booleanType{Kind::boolean};
inline constexpr BerType integerType{Kind::integer};
inline constexpr BerType nothing{Kind::null};
inline constexpr BerType numberDigits{Kind::digits, {}, {}, true};
inline constexpr BerType personalOctets{Kind::octets, {}, {}, true};

// Numbers and addresses. EN 300 196-1 annex D, "addressing data elements".

inline constexpr BerName publicTypeNames[] = {{0, "unknown type"}, {1, "international"},
                                              {2, "national"},     {3, "network specific"},
                                              {4, "subscriber"},   {6, "abbreviated"}};
inline constexpr BerName privateTypeNames[] = {
    {0, "unknown type"}, {1, "level 2 regional"}, {2, "level 1 regional"}, {3, "network specific"},
    {4, "local"},        {6, "abbreviated"}};
inline constexpr BerName screeningNames[] = {
    {0, "not screened"}, {1, "verified and passed"}, {2, "verified and failed"}, {3, "network provided"}};
inline constexpr BerType publicType = enumerated(publicTypeNames);
inline constexpr BerType privateType = enumerated(privateTypeNames);
inline constexpr BerType screening = enumerated(screeningNames);

inline constexpr BerMember publicMembers[] = {plain("type of number", publicType, Words::valueAlone),
                                              plain("digits", numberDigits, Words::valueAlone)};
inline constexpr BerMember privateMembers[] = {plain("type of number", privateType, Words::valueAlone),
                                               plain("digits", numberDigits, Words::valueAlone)};
inline constexpr BerType publicNumber = sequence(publicMembers);
inline constexpr BerType privateNumber = sequence(privateMembers);
inline constexpr BerMember partyMembers[] = {
    instead(0, "number of unknown plan", numberDigits, Words::valueAlone),
    instead(1, "public number", publicNumber, Words::valueAlone),
    instead(2, "NSAP number", personalOctets),
    instead(3, "data number", numberDigits),
    instead(4, "telex number", numberDigits),
    instead(5, "private number", privateNumber),
    instead(8, "national standard number", numberDigits),
};
inline constexpr BerType party = choice(partyMembers);

inline constexpr BerMember userSubaddressMembers[] = {plain("subaddress", personalOctets),
                                                      plain("odd number of digits", booleanType)};
inline constexpr BerType userSubaddress = sequence(userSubaddressMembers);
inline constexpr BerMember subaddressMembers[] = {plain("user specified subaddress", userSubaddress),
                                                  plain("NSAP subaddress", personalOctets)};
inline constexpr BerType partySubaddress = choice(subaddressMembers);
inline constexpr BerMember addressMembers[] = {plain("number", party, Words::valueAlone),
                                               plain("subaddress", partySubaddress)};
inline constexpr BerType address = sequence(addressMembers);

// Presented numbers and addresses: shown, restricted, or not known because of interworking.
inline constexpr BerMember unscreenedMembers[] = {
    around(0, "presentation allowed", party, Words::valueAlone),
    instead(1, "presentation restricted", nothing),
    instead(2, "not available due to interworking", nothing),
    around(3, "presentation restricted", party),
};
inline constexpr BerType presentedUnscreened = choice(unscreenedMembers);
inline constexpr BerMember screenedNumberMembers[] = {plain("number", party, Words::valueAlone),
                                                      plain("screening", screening, Words::valueAlone)};
inline constexpr BerType screenedNumber = sequence(screenedNumberMembers);
inline constexpr BerMember screenedMembers[] = {
    instead(0, "presentation allowed", screenedNumber, Words::valueAlone),
    instead(1, "presentation restricted", nothing),
    instead(2, "not available due to interworking", nothing),
    instead(3, "presentation restricted", screenedNumber),
};
inline constexpr BerType presentedScreened = choice(screenedMembers);
inline constexpr BerMember screenedAddressMembers[] = {plain("number", party, Words::valueAlone),
                                                       plain("screening", screening, Words::valueAlone),
                                                       plain("subaddress", partySubaddress)};
inline constexpr BerType screenedAddress = sequence(screenedAddressMembers);
inline constexpr BerMember presentedAddressMembers[] = {
    instead(0, "presentation allowed", screenedAddress, Words::valueAlone),
    instead(1, "presentation restricted", nothing),
    instead(2, "not available due to interworking", nothing),
    instead(3, "presentation restricted", screenedAddress),
};
inline constexpr BerType presentedAddress = choice(presentedAddressMembers);

}  // namespace isdn::facility

#endif
