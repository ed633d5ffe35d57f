#include "isdn/facility_numbers.h"
#include "isdn/facility_types.h"

namespace isdn::facility {
namespace {

// Diversion. EN 300 207-1 clause 6.

constexpr BerName reasonNames[] = {
    {0, "unknown reason"},           {1, "unconditional"},    {2, "busy"}, {3, "no reply"},
    {4, "deflected while alerting"}, {5, "deflected at once"}};
constexpr BerType reason = enumerated(reasonNames);
constexpr BerName procedureNames[] = {{0, "unconditional"}, {1, "busy"}, {2, "no reply"}};
constexpr BerType procedure = enumerated(procedureNames);
constexpr BerName subscriptionNames[] = {{0, "caller is not told"},
                                         {1, "caller is told, without the number"},
                                         {2, "caller is told, with the number"}};
constexpr BerType subscription = enumerated(subscriptionNames);
constexpr BerName basicNames[] = {{0, "all services"},
                                  {1, "speech"},
                                  {2, "unrestricted digital"},
                                  {3, "3.1 kHz audio"},
                                  {4, "unrestricted digital with tones"},
                                  {5, "multirate"},
                                  {32, "telephony 3.1 kHz"},
                                  {33, "teletex"},
                                  {34, "fax group 4 class 1"},
                                  {35, "videotex"},
                                  {36, "video telephony"},
                                  {37, "fax group 2 or 3"},
                                  {38, "telephony 7 kHz"},
                                  {39, "Euro file transfer"},
                                  {40, "file transfer and access management"},
                                  {41, "video conference"},
                                  {42, "audiographic conference"}};
constexpr BerType basicService = enumerated(basicNames);
constexpr BerMember servedMembers[] = {plain("all numbers", nothing),
                                       plain("one number", party, Words::valueAlone)};
constexpr BerType servedUser = choice(servedMembers);
constexpr BerMember activationMembers[] = {plain("procedure", procedure, Words::valueAlone),
                                           plain("service", basicService, Words::valueAlone),
                                           plain("forwarded to", address), plain("served user", servedUser)};
constexpr BerMember deactivationMembers[] = {plain("procedure", procedure, Words::valueAlone),
                                             plain("service", basicService, Words::valueAlone),
                                             plain("served user", servedUser)};
constexpr BerMember informationMembers[] = {
    plain("reason", reason),
    plain("service", basicService, Words::valueAlone),
    plain("served user's subaddress", partySubaddress),
    around(0, "calling", presentedAddress),
    around(1, "originally called", presentedUnscreened),
    around(2, "last diverting", presentedUnscreened),
    around(3, "last reason", reason),
};
constexpr BerMember deflectionMembers[] = {plain("deflected to", address),
                                           plain("number may be shown to the caller", booleanType)};
constexpr BerMember rerouteingMembers[] = {plain("reason", reason), plain("called", address),
                                           plain("counter", integerType),
                                           // Elements of the SETUP, as [APPLICATION 0]: raw.
                                           around(1, "last diverting", presentedUnscreened),
                                           instead(2, "subscription", subscription, Words::valueAlone),
                                           around(3, "calling subaddress", partySubaddress)};
constexpr BerMember leg1Members[] = {plain("reason", reason),
                                     plain("subscription", subscription, Words::valueAlone),
                                     plain("diverted to", presentedUnscreened)};
constexpr BerMember leg2Members[] = {plain("counter", integerType), plain("reason", reason),
                                     around(1, "diverting", presentedUnscreened),
                                     around(2, "originally called", presentedUnscreened)};

// Explicit call transfer, EN 300 369-1. Completion of calls to a busy user, EN 300 359-1.

constexpr BerName informNames[] = {{0, "alerting"}, {1, "active"}};
constexpr BerType informState = enumerated(informNames);
constexpr BerMember informMembers[] = {plain("state", informState, Words::valueAlone),
                                       plain("redirection", presentedUnscreened)};

// Names. ECMA-164 annex A.

constexpr BerType nameData{Kind::name, {}, {}, true};
constexpr BerName characterSets[] = {{0, "unknown"},    {1, "ISO 8859-1"},    {3, "ISO 8859-2"},
                                     {4, "ISO 8859-3"}, {5, "ISO 8859-4"},    {6, "ISO 8859-5"},
                                     {7, "ISO 8859-7"}, {8, "ISO 10646 BMP"}, {9, "ISO 10646 UTF-8"}};
constexpr BerType characterSet{Kind::integer, {}, characterSets};
constexpr BerMember nameSetMembers[] = {plain("name", nameData, Words::valueAlone),
                                        plain("character set", characterSet)};
constexpr BerType nameSet = sequence(nameSetMembers);
constexpr BerMember nameMembers[] = {
    instead(0, "name", nameData, Words::valueAlone),
    instead(1, "name", nameSet, Words::valueAlone),
    instead(2, "restricted name", nameData),
    instead(3, "restricted name", nameSet),
    instead(4, "not available", nothing),
    instead(7, "restricted", nothing),
};
constexpr BerType name = choice(nameMembers);
constexpr BerMember nameSequenceMembers[] = {plain("name", name, Words::valueAlone)};
constexpr BerType nameSequence = sequence(nameSequenceMembers);
constexpr BerMember nameArgumentMembers[] = {plain("", name, Words::valueAlone),
                                             plain("", nameSequence, Words::valueAlone)};

// Call transfer and path replacement in private networks. ECMA-178, ECMA-176.

constexpr BerName endNames[] = {{0, "primary end"}, {1, "secondary end"}};
constexpr BerType end = enumerated(endNames);
constexpr BerName statusNames[] = {{0, "answered"}, {1, "alerting"}};
constexpr BerType callStatus = enumerated(statusNames);
constexpr BerMember activeMembers[] = {plain("connected", presentedAddress), plain("connected name", name)};
constexpr BerMember completeMembers[] = {
    plain("end", end, Words::valueAlone), plain("redirection", presentedScreened),
    plain("redirection name", name), plain("call status", callStatus, Words::valueAlone)};
constexpr BerMember updateMembers[] = {plain("redirection", presentedScreened),
                                       plain("redirection name", name)};
constexpr BerMember initiateMembers[] = {plain("call identity", numberDigits),
                                         plain("rerouteing number", party)};
constexpr BerMember identityMembers[] = {plain("call identity", numberDigits)};

// Diversion in private networks. ECMA-174.

constexpr BerMember privateLeg1Members[] = {plain("reason", reason),
                                            plain("subscription", subscription, Words::valueAlone),
                                            plain("diverted to", party)};
constexpr BerMember privateLeg2Members[] = {plain("counter", integerType),
                                            plain("reason", reason),
                                            instead(0, "original reason", reason),
                                            around(1, "diverting", presentedUnscreened),
                                            around(2, "originally called", presentedUnscreened),
                                            around(3, "redirecting name", name),
                                            around(4, "original called name", name)};
constexpr BerMember privateLeg3Members[] = {plain("number may be shown to the caller", booleanType),
                                            around(0, "redirection name", name)};
constexpr BerMember messageWaitingMembers[] = {plain("served user", party),
                                               plain("service", basicService, Words::valueAlone)};

// Network facility extension. ECMA-165.

constexpr BerName entityNames[] = {{0, "end exchange"}, {1, "any exchange"}};
constexpr BerType entity = enumerated(entityNames);
constexpr BerMember extensionMembers[] = {instead(0, "source", entity), around(1, "source number", party),
                                          instead(2, "destination", entity),
                                          around(3, "destination number", party)};

constexpr BerName interpretationNames[] = {{0, "discard what is not known"},
                                           {1, "clear the call if it is not known"},
                                           {2, "reject what is not known"}};

}  // namespace

const BerType activation = sequence(activationMembers);
const BerType deactivation = sequence(deactivationMembers);
const BerType diversionInformation = sequence(informationMembers);
const BerType callDeflection = sequence(deflectionMembers);
const BerType callRerouteing = sequence(rerouteingMembers);
const BerType leg1 = sequence(leg1Members);
const BerType leg2 = sequence(leg2Members);
const BerType truth = booleanType;
const BerType number = integerType;
const BerType transferInform = sequence(informMembers);
const BerType subaddress = partySubaddress;
const BerType nameArgument = choice(nameArgumentMembers);
const BerType transferActive = sequence(activeMembers);
const BerType transferComplete = sequence(completeMembers);
const BerType transferUpdate = sequence(updateMembers);
const BerType transferInitiate = sequence(initiateMembers);
const BerType transferIdentity = sequence(identityMembers);
const BerType privateLeg1 = sequence(privateLeg1Members);
const BerType privateLeg2 = sequence(privateLeg2Members);
const BerType privateLeg3 = sequence(privateLeg3Members);
const BerType messageWaiting = sequence(messageWaitingMembers);
const BerType networkExtension = sequence(extensionMembers);
const BerType interpretation = enumerated(interpretationNames);

}  // namespace isdn::facility
