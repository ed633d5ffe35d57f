// Names of values that not only the tables use.
#include "isdn/Table.h"
#include "isdn/tables/numbers.h"
#include "isdn/values.h"

namespace isdn {

namespace {

// clang-format off

// Q.850 table 1.
constexpr Name causes[] = {
    {1, "unallocated number"},
    {2, "no route to transit network"},
    {3, "no route to destination"},
    {4, "send special information tone"},
    {5, "misdialled trunk prefix"},
    {6, "channel unacceptable"},
    {7, "call awarded in an established channel"},
    {8, "preempted"},
    {9, "preempted, circuit kept"},
    {14, "ported number"},
    {16, "normal clearing"},
    {17, "user busy"},
    {18, "no user responding"},
    {19, "no answer, user alerted"},
    {20, "subscriber absent"},
    {21, "call rejected"},
    {22, "number changed"},
    {23, "redirected to new destination"},
    {24, "rejected by a feature at the destination"},
    {25, "exchange routing error"},
    {26, "cleared as another user was selected"},
    {27, "destination out of order"},
    {28, "invalid or incomplete number"},
    {29, "facility rejected"},
    {30, "response to STATUS ENQUIRY"},
    {31, "normal, unspecified"},
    {34, "no channel available"},
    {38, "network out of order"},
    {39, "frame mode connection out of service"},
    {40, "frame mode connection works"},
    {41, "temporary failure"},
    {42, "switching equipment congested"},
    {43, "access information discarded"},
    {44, "requested channel not available"},
    {46, "precedence call blocked"},
    {47, "resources unavailable, unspecified"},
    {49, "quality of service unavailable"},
    {50, "requested facility not subscribed"},
    {53, "outgoing calls barred in closed user group"},
    {55, "incoming calls barred in closed user group"},
    {57, "bearer capability not authorized"},
    {58, "bearer capability not available now"},
    {62, "outgoing access inconsistent with subscriber class"},
    {63, "service or option unavailable, unspecified"},
    {65, "bearer capability not implemented"},
    {66, "channel type not implemented"},
    {69, "requested facility not implemented"},
    {70, "only restricted digital bearer available"},
    {79, "service or option not implemented, unspecified"},
    {81, "invalid call reference"},
    {82, "identified channel does not exist"},
    {83, "a suspended call exists, this identity does not"},
    {84, "call identity in use"},
    {85, "no call suspended"},
    {86, "suspended call was cleared"},
    {87, "user not member of closed user group"},
    {88, "incompatible destination"},
    {90, "closed user group does not exist"},
    {91, "invalid transit network selection"},
    {95, "invalid message, unspecified"},
    {96, "mandatory element missing"},
    {97, "message type unknown or not implemented"},
    {98, "message does not fit the call state, or is unknown"},
    {99, "element or parameter unknown or not implemented"},
    {100, "invalid element contents"},
    {101, "message does not fit the call state"},
    {102, "recovery on timer expiry"},
    {103, "unknown parameter passed on"},
    {110, "message with unknown parameter discarded"},
    {111, "protocol error, unspecified"},
    {127, "interworking, unspecified"},
};

// Q.850 2.2.3. "Local" and "remote" are meant from the point of view of the user to whom the network sends
// the cause.
constexpr Name locations[] = {
    {0, "user"},
    {1, "local private network"},
    {2, "local public network"},
    {3, "transit network"},
    {4, "remote public network"},
    {5, "remote private network"},
    {7, "international network"},
    {10, "network beyond interworking"},
};

// Q.931 4.5.7; 31 is Q.932's.
constexpr Name callStates[] = {
    {0, "null"},
    {1, "call initiated"},
    {2, "overlap sending"},
    {3, "outgoing call proceeding"},
    {4, "call delivered"},
    {6, "call present"},
    {7, "call received"},
    {8, "connect request"},
    {9, "incoming call proceeding"},
    {10, "active"},
    {11, "disconnect request"},
    {12, "disconnect indication"},
    {15, "suspend request"},
    {17, "resume request"},
    {19, "release request"},
    {22, "call abort"},
    {25, "overlap receiving"},
    {31, "call-independent service"},
    {61, "restart request"},
    {62, "restart"},
};

// Q.931 4.5.23.
constexpr Name progresses[] = {
    {1, "not ISDN end to end"},
    {2, "destination not ISDN"},
    {3, "origin not ISDN"},
    {4, "back in the ISDN"},
    {5, "interworking changed the service"},
    {8, "in-band information"},
};

// Q.931 4.5.22; from 3 on Q.951 to Q.957.
constexpr Name notifications[] = {
    {0, "user suspended"},
    {1, "user resumed"},
    {2, "bearer service changed"},
    {3, "components follow"},
    {4, "call completion delayed"},
    {66, "conference established"},
    {67, "conference disconnected"},
    {68, "other party added"},
    {69, "isolated"},
    {70, "reattached"},
    {71, "other party isolated"},
    {72, "other party reattached"},
    {73, "other party split"},
    {74, "other party disconnected"},
    {75, "conference floating"},
    {96, "call is waiting"},
    {104, "diversion activated"},
    {105, "transferred, alerting"},
    {106, "transferred, active"},
    {121, "held by the remote user"},
    {122, "retrieved by the remote user"},
    {123, "call is diverted"},
};

// clang-format on

}  // namespace

std::string_view causeName(std::uint8_t value) { return Names(causes)(value); }
std::string_view locationName(std::uint8_t location) { return Names(locations)(location); }
std::string_view numberTypeName(std::uint8_t type) { return Names(tables::numberTypes)(type); }
std::string_view numberingPlanName(std::uint8_t plan) { return Names(tables::numberingPlans)(plan); }
std::string_view callStateName(std::uint8_t value) { return Names(callStates)(value); }
std::string_view progressName(std::uint8_t value) { return Names(progresses)(value); }
std::string_view notificationName(std::uint8_t value) { return Names(notifications)(value); }

}  // namespace isdn
