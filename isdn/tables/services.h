// What users and networks tell each other beside the call: texts, user data, facilities, packet parameters,
// and national elements (Q.931 4.5 and 4.6, Q.932 8.2).
#ifndef ISDN_TABLES_SERVICES_H
#define ISDN_TABLES_SERVICES_H

#include "isdn/readers.h"
#include "isdn/tables/compatibility.h"
#include "isdn/tables/numbers.h"

namespace isdn::tables {

// clang-format off

// Q.931 4.5.26. Bit 8 of octet 3 is no extension bit.
inline constexpr Name segmentKinds[] = {{0, "a later segment"}, {1, "the first segment"}};
inline constexpr Row segmentRows[] = {
    {"3", bits(8, 8), "first segment", segmentKinds},
    {"", bits(7, 1), "segments that follow"},
    {"4", bits(8, 1), "message", callControlMessageName},
};

inline constexpr Row dateTimeRows[] = {
    {"3", bits(8, 1), "year"},
    {"4", bits(8, 1), "month"},
    {"5", bits(8, 1), "day"},
    {"6", bits(8, 1), "hour", {}, optional},
    {"7", bits(8, 1), "minute", {}, optional},
    {"8", bits(8, 1), "second", {}, optional},
};

inline constexpr Row displayRows[] = {personal({"3", rest(readDisplay), "display", {}, optional})};
inline constexpr Row displayFieldRows[] = {personal({"3", rest(readDisplayFields), "display", {}, optional})};
inline constexpr Row keypadRows[] = {personal({"3", rest(readCharacters), "keypad", {}, optional})};
inline constexpr Row callIdentityRows[] = {personal({"3", rest(), "call identity", {}, optional})};
inline constexpr Row profileRows[] = {personal({"3", rest(readCharacters), "service profile", {}, optional})};

// Q.931 4.5.30.
inline constexpr Name userProtocols[] = {
    {0, "user-specific"},
    {1, "OSI high layers"},
    {2, "X.244"},
    {3, "system management convergence"},
    {4, "IA5 characters"},
    {5, "ASN.1"},
    {7, "V.120 rate adaption"},
    {8, "Q.931"},
};
inline constexpr Row userUserRows[] = {
    {"3", bits(8, 1), "protocol", userProtocols},
    personal({"4", rest(readUserInformation), "user information", {}, optional}),
};
inline constexpr Row userUserFacilityRows[] = {
    {"3", bits(8, 1), "protocol"},
    personal({"4", rest(), "user information", {}, optional}),
};

// Q.931 4.5.21. What octet 4 says is the network's own affair; on 4ESS trunks it names a carrier's service.
inline constexpr When networkNamed = ifNotZero("3");
inline constexpr Name featureOrService[] = {{0, "feature"}, {1, "service"}};
inline constexpr Name binaryOrParameters[] = {{0, "with parameters"}, {1, "binary"}};
inline constexpr Name carrierServices[] = {
    {1, "software defined network"},
    {2, "toll-free 800"},
    {3, "wide area"},
    {6, "switched digital"},
    {8, "international toll-free 800"},
};
inline constexpr Row networkFacilityRows[] = {
    {"3", bits(8, 1), "length of network identification"},
    {"3.1", bits(7, 5), "type of network identification", networkTypes, networkNamed},
    {"", bits(4, 1), "network identification plan", networkPlans},
    {"3.2", counted("3", 1, readCharacters), "network", {}, networkNamed},
    {"4", bits(8, 8), "kind of facility", binaryOrParameters, on(only(Variant::ess4))},
    {"", bits(6, 6), "feature or service", featureOrService},
    {"", bits(5, 1), "service", carrierServices, ifSeen("4", 6, 6, {1})},
    {"", bits(5, 1), "feature"},
    {"4", bits(7, 1), "facility", {}, optional & on(everywhereBut(Variant::ess4))},
    personal({"5", rest(), "parameters", {}, optional}),
};

// Q.932 8.2.
inline constexpr Row featureActivationRows[] = {
    {"3", bits(7, 1), "feature"},
    {"3a", bits(7, 1), "feature, continued", {}, extended},
};
inline constexpr Name featureStates[] = {{0, "off"}, {1, "on"}, {2, "prompt"}, {3, "pending"}};
inline constexpr Row featureIndicationRows[] = {
    {"3", bits(7, 1), "feature"},
    {"3a", bits(7, 1), "feature, continued", {}, extended},
    {"4", reserved(8, 5), "spare"},
    {"", bits(4, 1), "state", featureStates},
};
inline constexpr Name requests[] = {{0, "completed"}, {1, "prompt for more"}};
inline constexpr Name informationTypes[] = {
    {0, "undefined"},
    {1, "authorization code"},
    {2, "address digits"},
    {3, "terminal identification"},
};
inline constexpr Row informationRequestRows[] = {
    {"3", bits(7, 7), "request", requests},
    {"", bits(6, 1), "type of information", informationTypes},
    {"3a", bits(7, 1), "specific information", {}, extended},
};
inline constexpr Name interpreters[] = {{0, "terminal identifier"}, {1, "any but the terminal identifier"}};
inline constexpr Row endpointRows[] = {
    {"3", bits(7, 1), "user service identifier"},
    {"4", bits(7, 7), "interpreter", interpreters, optional},
    {"", bits(6, 1), "terminal identifier"},
};
inline constexpr Row facilityRows[] = {
    {"3", rest(readFacility), "facility", {}, optional},
};

// Q.931 4.6.
inline constexpr Name throughputs[] = {
    {3, "75 bit/s"},
    {4, "150 bit/s"},
    {5, "300 bit/s"},
    {6, "600 bit/s"},
    {7, "1200 bit/s"},
    {8, "2400 bit/s"},
    {9, "4800 bit/s"},
    {10, "9600 bit/s"},
    {11, "19200 bit/s"},
    {12, "48000 bit/s"},
    {13, "64000 bit/s"},
};
inline constexpr Row informationRateRows[] = {
    {"3", bits(5, 1), "rate in", throughputs},
    {"4", bits(5, 1), "rate out", throughputs},
    {"5", bits(5, 1), "least rate in", throughputs},
    {"6", bits(5, 1), "least rate out", throughputs},
};
inline constexpr Row transitDelayRows[] = {
    {"3", bits(2, 1), "delay so far, ms, upper bits"},
    {"3a", bits(7, 1), "middle bits", {}, extended},
    {"3b", bits(7, 1), "lower bits", {}, extended},
    {"4", bits(2, 1), "delay asked for, ms, upper bits", {}, optional},
    {"4a", bits(7, 1), "middle bits", {}, extended},
    {"4b", bits(7, 1), "lower bits", {}, extended},
    {"5", bits(2, 1), "greatest delay, ms, upper bits", {}, optional},
    {"5a", bits(7, 1), "middle bits", {}, extended},
    {"5b", bits(7, 1), "lower bits", {}, extended},
};
inline constexpr Row delaySelectionRows[] = {
    {"3", bits(2, 1), "delay, ms, upper bits"},
    {"3a", bits(7, 1), "middle bits", {}, extended},
    {"3b", bits(7, 1), "lower bits", {}, extended},
};
inline constexpr Name fastSelects[] = {
    {0, "not requested"},
    {1, "not requested"},
    {2, "requested, response not restricted"},
    {3, "requested, response restricted"},
};
inline constexpr Name asked[] = {{0, "not requested"}, {1, "requested"}};
inline constexpr Name confirmations[] = {{0, "link by link"}, {1, "end to end"}};
inline constexpr Name modulos[] = {{0, "8"}, {1, "128"}};
inline constexpr Row packetBinaryRows[] = {
    {"3", bits(5, 4), "fast select", fastSelects},
    {"", bits(3, 3), "expedited data", asked},
    {"", bits(2, 2), "delivery confirmation", confirmations},
    {"", bits(1, 1), "modulo", modulos},
};
inline constexpr Row windowRows[] = {
    {"3", bits(7, 1), "window forward"},
    {"4", bits(7, 1), "window back", {}, optional},
};
inline constexpr Row packetSizeRows[] = {
    {"3", bits(4, 1), "packet size forward", packetSizes},
    {"4", bits(4, 1), "packet size back", packetSizes, optional},
};
inline constexpr Name groupKinds[] = {{1, "selected"}, {2, "selected, with outgoing access"}};
inline constexpr Row userGroupRows[] = {
    {"3", bits(3, 1), "closed user group", groupKinds},
    {"4", rest(readCharacters), "index", {}, optional},
};
inline constexpr Name charges[] = {{1, "requested"}};
inline constexpr Row reverseChargeRows[] = {{"3", bits(3, 1), "reverse charging", charges}};

// National elements.
inline constexpr Row terminalRows[] = {
    {"3", bits(8, 7), "coding standard", codingStandards},
    {"", bits(6, 1), "capability"},
};
inline constexpr Row adviceRows[] = {
    {"3", bits(3, 1), "type of indication"},
    {"4", rest(), "charges", {}, optional},
};
inline constexpr Row appearanceRows[] = {
    {"3", bits(7, 1), "call appearance"},
    {"3a", bits(7, 1), "call appearance, continued", {}, extended},
};
inline constexpr Row lineInformationRows[] = {{"3", bits(8, 1), "kind of line"}};
inline constexpr Row genericDigitsRows[] = {
    {"3", bits(8, 6), "encoding"},
    {"", bits(5, 1), "type of digits"},
    personal({"4", rest(), "digits", {}, optional}),
};
// Private networks: ISO/IEC 11572.
inline constexpr Name partyCategories[] = {{0, "unknown"}, {1, "extension"}, {2, "operator"}, {3, "emergency extension"}};
inline constexpr Row partyCategoryRows[] = {{"3", bits(3, 1), "category", partyCategories}};
inline constexpr Row transitCounterRows[] = {{"3", bits(5, 1), "networks crossed"}};

inline constexpr Variants ni2Alone = only(Variant::ni2);

inline constexpr ElementTable serviceTables[] = {
    {0, element::segmentedMessage, "SEGMENTED MESSAGE", "Q.931 4.5.26", segmentRows},
    {0, element::changeStatus, "ADVICE OF CHARGE", "national", adviceRows, only(Variant::ntt)},
    {0, element::extendedFacility, "EXTENDED FACILITY", "Q.932 8.2", facilityRows},
    {0, element::callIdentity, "CALL IDENTITY", "Q.931 4.5.6", callIdentityRows},
    {0, element::facility, "FACILITY", "Q.932 8.2", facilityRows},
    {0, element::networkFacilities, "NETWORK-SPECIFIC FACILITIES", "Q.931 4.5.21", networkFacilityRows},
    {0, 0x21, "CALL IDENTITY", "national", callIdentityRows},
    {0, 0x24, "TERMINAL CAPABILITIES", "national", terminalRows},
    {0, element::display, "DISPLAY", "Q.931 4.5.16", displayRows},
    {0, element::dateTime, "DATE/TIME", "Q.931 4.5.15", dateTimeRows},
    {0, element::keypad, "KEYPAD FACILITY", "Q.931 4.5.18", keypadRows},
    {0, 0x32, "INFORMATION REQUEST", "Q.932 8.2", informationRequestRows},
    {0, 0x38, "FEATURE ACTIVATION", "Q.932 8.2", featureActivationRows},
    {0, 0x39, "FEATURE INDICATION", "Q.932 8.2", featureIndicationRows},
    {0, 0x3A, "SERVICE PROFILE IDENTIFICATION", "Q.932 8.2", profileRows},
    {0, 0x3B, "ENDPOINT IDENTIFIER", "Q.932 8.2", endpointRows},
    {0, 0x40, "INFORMATION RATE", "Q.931 4.6.3", informationRateRows},
    {0, 0x42, "END-TO-END TRANSIT DELAY", "Q.931 4.6.2", transitDelayRows},
    {0, 0x43, "TRANSIT DELAY SELECTION AND INDICATION", "Q.931 4.6.9", delaySelectionRows},
    {0, 0x44, "PACKET LAYER BINARY PARAMETERS", "Q.931 4.6.4", packetBinaryRows},
    {0, 0x45, "PACKET LAYER WINDOW SIZE", "Q.931 4.6.5", windowRows},
    {0, 0x46, "PACKET SIZE", "Q.931 4.6.6", packetSizeRows},
    {0, 0x47, "CLOSED USER GROUP", "Q.931 4.6.1", userGroupRows},
    {0, 0x4A, "REVERSE CHARGING INDICATION", "Q.931 4.6.8", reverseChargeRows},
    {0, 0x7A, "USER-USER FACILITY", "national", userUserFacilityRows},
    {0, 0x7B, "CALL APPEARANCE", "national", appearanceRows, northAmerica},
    {0, element::userUser, "USER-USER", "Q.931 4.5.30", userUserRows},
    {4, 0x31, "TRANSIT COUNTER", "ISO/IEC 15056", transitCounterRows},
    {5, 0x2A, "DISPLAY", "national", displayFieldRows, ni2Alone},
    {5, 0x32, "PARTY CATEGORY", "ISO/IEC 11572", partyCategoryRows},
    {5, 0x75, "REDIRECTING SUBADDRESS", "national", subaddressRows, ni2Alone},
    {5, 0x7B, "CALL APPEARANCE", "national", appearanceRows, ni2Alone},
    {6, 0x01, "ORIGINATING LINE INFORMATION", "national", lineInformationRows, northAmerica},
    {6, 0x37, "GENERIC DIGITS", "national", genericDigitsRows, northAmerica},
};

// clang-format on

}  // namespace isdn::tables

#endif
