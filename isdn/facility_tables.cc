#include "isdn/facility_tables.h"

#include <algorithm>
#include <array>
#include <span>

#include "isdn/facility_types.h"

namespace isdn::facility {
namespace {

constexpr std::string_view local;  // no object identifier

constexpr std::string_view userUser = "EN 300 286-1", closedGroup = "EN 300 138-1",
                           malicious = "EN 300 130-1", threeParty = "EN 300 188-1",
                           diversion = "EN 300 207-1", charges = "EN 300 182-1", conference = "EN 300 185-1",
                           busyCompletion = "EN 300 359-1", noReplyCompletion = "EN 301 065-1",
                           transfer = "EN 300 369-1", waiting = "EN 300 745-1";

constexpr Operation etsiOperations[] = {
    {1, local, "user-to-user service", userUser},
    {2, local, "closed user group call", closedGroup},
    {3, local, "malicious call identification", malicious},
    {4, local, "begin three-party", threeParty},
    {5, local, "end three-party", threeParty},
    {6, local, "call transfer", transfer},
    {7, local, "activate diversion", diversion, &activation},
    {8, local, "deactivate diversion", diversion, &deactivation},
    {9, local, "diversion was activated", diversion, &activation},
    {10, local, "diversion was deactivated", diversion, &deactivation},
    {11, local, "interrogate diversion", diversion, &deactivation},
    {12, local, "diversion information", diversion, &diversionInformation},
    {13, local, "call deflection", diversion, &callDeflection},
    {14, local, "call rerouteing", diversion, &callRerouteing},
    {15, local, "diverting leg information 2", diversion, &leg2},
    {17, local, "interrogate served user numbers", diversion},
    {18, local, "diverting leg information 1", diversion, &leg1},
    {19, local, "diverting leg information 3: number may be shown", diversion, &truth},
    {30, local, "charging request", charges, &chargingRequest},
    {31, local, "charges at set-up", charges, &aocSetUp},
    {32, local, "charges at set-up, special arrangement", charges, &aocSetUpSpecial},
    {33, local, "charges during the call, currency", charges, &aocDuringCurrency},
    {34, local, "charges during the call, units", charges, &aocDuringUnits},
    {35, local, "charges at the end of the call, currency", charges, &aocEndCurrency},
    {36, local, "charges at the end of the call, units", charges, &aocEndUnits},
    {40, local, "begin conference", conference},
    {41, local, "add to conference", conference},
    {42, local, "split from conference", conference},
    {43, local, "drop from conference", conference},
    {44, local, "isolate in conference", conference},
    {45, local, "reattach to conference", conference},
    {46, local, "conference party disconnected", conference},
    {-1, "0.4.0.359.1.1", "call completion: call information retained, linkage", busyCompletion, &number},
    {-1, "0.4.0.359.1.2", "call completion: request on busy, linkage", busyCompletion, &number},
    {-1, "0.4.0.359.1.3", "call completion: deactivate, reference", busyCompletion, &number},
    {-1, "0.4.0.359.1.4", "call completion: interrogate", busyCompletion},
    {-1, "0.4.0.359.1.5", "call completion: erased", busyCompletion},
    {-1, "0.4.0.359.1.6", "call completion: remote user free", busyCompletion},
    {-1, "0.4.0.359.1.7", "call completion: call, reference", busyCompletion, &number},
    {-1, "0.4.0.359.1.8", "call completion: status request", busyCompletion},
    {-1, "0.4.0.359.1.9", "call completion: user B free", busyCompletion},
    {-1, "0.4.0.359.1.10", "call completion: linkage erased", busyCompletion, &number},
    {-1, "0.4.0.359.1.11", "call completion: stop alerting, reference", busyCompletion, &number},
    {-1, "0.4.0.359.2.1", "call completion: private network, call", busyCompletion},
    {-1, "0.4.0.359.2.2", "call completion: private network, suspend", busyCompletion},
    {-1, "0.4.0.359.2.3", "call completion: private network, resume", busyCompletion},
    {-1, "0.4.0.359.2.4", "call completion: private network, remote user free", busyCompletion},
    {-1, "0.4.0.359.2.5", "call completion: private network, available", busyCompletion},
    {-1, "0.4.0.359.2.6", "call completion: private network, request", busyCompletion},
    {-1, "0.4.0.1065.1.1", "call completion: request on no reply, linkage", noReplyCompletion, &number},
    {-1, "0.4.0.1065.1.2", "call completion: interrogate on no reply", noReplyCompletion},
    {-1, "0.4.0.369.1.1", "explicit call transfer, link", transfer, &number},
    {-1, "0.4.0.369.1.2", "request subaddress", transfer},
    {-1, "0.4.0.369.1.3", "subaddress transfer", transfer, &subaddress},
    {-1, "0.4.0.369.1.4", "transfer: link identity request", transfer, nullptr, &number},
    {-1, "0.4.0.369.1.5", "transfer: inform", transfer, &transferInform},
    {-1, "0.4.0.369.1.6", "transfer: loop test", transfer},
    {-1, "0.4.0.745.1.1", "message waiting: activate", waiting},
    {-1, "0.4.0.745.1.2", "message waiting: deactivate", waiting},
    {-1, "0.4.0.745.1.3", "message waiting: indicate", waiting},
};

constexpr Operation privateOperations[] = {
    {0, local, "calling name", "ECMA-164", &nameArgument},
    {1, local, "called name", "ECMA-164", &nameArgument},
    {2, local, "connected name", "ECMA-164", &nameArgument},
    {3, local, "busy name", "ECMA-164", &nameArgument},
    {4, local, "path replacement: propose", "ECMA-176", &transferInitiate},
    {5, local, "path replacement: set up", "ECMA-176", &transferIdentity},
    {6, local, "path replacement: retain", "ECMA-176"},
    {7, local, "call transfer: identify", "ECMA-178", nullptr, &transferInitiate},
    {8, local, "call transfer: abandon", "ECMA-178"},
    {9, local, "call transfer: initiate", "ECMA-178", &transferInitiate},
    {10, local, "call transfer: set up", "ECMA-178", &transferIdentity},
    {11, local, "call transfer: active", "ECMA-178", &transferActive},
    {12, local, "call transfer: complete", "ECMA-178", &transferComplete},
    {13, local, "call transfer: update", "ECMA-178", &transferUpdate},
    {14, local, "call transfer: subaddress", "ECMA-178", &subaddress},
    {15, local, "activate diversion", "ECMA-174"},
    {16, local, "deactivate diversion", "ECMA-174"},
    {17, local, "interrogate diversion", "ECMA-174"},
    {18, local, "check restriction", "ECMA-174"},
    {19, local, "call rerouteing", "ECMA-174"},
    {20, local, "diverting leg information 1", "ECMA-174", &privateLeg1},
    {21, local, "diverting leg information 2", "ECMA-174", &privateLeg2},
    {22, local, "diverting leg information 3", "ECMA-174", &privateLeg3},
    {23, local, "diverted leg failed", "ECMA-174"},
    {27, local, "call completion: request on no reply", "ECMA-186"},
    {28, local, "call completion: cancel", "ECMA-186"},
    {29, local, "call completion: execution possible", "ECMA-186"},
    {30, local, "call completion: reserve path", "ECMA-186"},
    {31, local, "call completion: ring out", "ECMA-186"},
    {32, local, "call completion: suspend", "ECMA-186"},
    {33, local, "call completion: resume", "ECMA-186"},
    {34, local, "call offer: request", "ECMA-192"},
    {35, local, "activate do not disturb", "ECMA-194"},
    {36, local, "deactivate do not disturb", "ECMA-194"},
    {37, local, "interrogate do not disturb", "ECMA-194"},
    {38, local, "override do not disturb", "ECMA-194"},
    {39, local, "execute override of do not disturb", "ECMA-194"},
    {40, local, "call completion: request on busy", "ECMA-186"},
    {41, local, "retain path", "ECMA-192"},
    {42, local, "service available", "ECMA-192"},
    {43, local, "call intrusion: request", "ECMA-203"},
    {44, local, "call intrusion: get capability", "ECMA-203"},
    {45, local, "call intrusion: isolate", "ECMA-203"},
    {46, local, "call intrusion: forced release", "ECMA-203"},
    {47, local, "call intrusion: wait on busy", "ECMA-203"},
    {48, local, "call intrusion: completed", "ECMA-203"},
    {49, local, "override of diversion on busy", "ECMA-192"},
    {57, local, "recall: alerting", "ECMA-214"},
    {58, local, "recall: answered", "ECMA-214"},
    {59, local, "charge request", "ECMA-212"},
    {60, local, "get final charge", "ECMA-212"},
    {61, local, "final charge", "ECMA-212"},
    {62, local, "interim charge", "ECMA-212"},
    {63, local, "charge rate", "ECMA-212"},
    {64, local, "charges complete", "ECMA-212"},
    {65, local, "charge request of a diverted call", "ECMA-212"},
    {66, local, "interception: leg information 1", "ECMA-221"},
    {67, local, "interception: leg information 2", "ECMA-221"},
    {68, local, "interception: condition", "ECMA-221"},
    {69, local, "interception: disable", "ECMA-221"},
    {70, local, "interception: enable", "ECMA-221"},
    {80, local, "messages wait", "ECMA-242", &messageWaiting},
    {81, local, "no message waits", "ECMA-242", &messageWaiting},
    {82, local, "interrogate waiting messages", "ECMA-242", &messageWaiting},
    {84, local, "common information: request", "ECMA-251"},
    {85, local, "common information: inform", "ECMA-251"},
    {86, local, "path replacement: invite", "ECMA-176"},
    {87, local, "call interruption: request", "ECMA-264"},
    {88, local, "call protection: request", "ECMA-264"},
    {99, local, "single-step transfer: initiate", "ECMA-300"},
    {100, local, "single-step transfer: set up", "ECMA-300"},
};

constexpr Operation northAmericanOperations[] = {
    {0, local, "calling name", "GR-1367", &nameArgument},
    {-1, "1.2.840.10005.0.4", "information follows", "GR-1367"},
    {-1, "1.2.840.10005.0.8", "two B-channel transfer", "GR-2865"},
};

struct Error {
    std::int64_t number;
    std::string_view name;
};

// EN 300 196-1 annex D, and the services' own.
constexpr Error etsiErrors[] = {
    {0, "not subscribed"},
    {1, "rejected by the network"},
    {2, "rejected by the user"},
    {3, "not available"},
    {4, "not implemented"},
    {5, "insufficient information"},
    {6, "invalid served user number"},
    {7, "invalid call state"},
    {8, "basic service not provided"},
    {9, "not an incoming call"},
    {10, "not allowed beside another service"},
    {11, "resource unavailable"},
    {12, "invalid diverted-to number"},
    {14, "diversion to a special service"},
    {15, "diversion to the served user"},
    {16, "invalid closed user group index"},
    {17, "service not allowed in the closed user group"},
    {18, "outgoing calls barred in the closed user group"},
    {19, "incoming calls barred in the closed user group"},
    {20, "user is no member of the closed user group"},
    {21, "facility does not fit the class of subscriber"},
    {23, "the call was already accepted"},
    {24, "too many diversions"},
    {25, "call failure"},
    {26, "no charging information available"},
    {28, "unknown conference"},
    {29, "unknown conference party"},
    {30, "too many parties"},
    {31, "not active"},
    {32, "not allowed"},
    {43, "procedural error"},
    {44, "precedence level not authorized"},
    {46, "not activated"},
    {48, "request already accepted"},
};

// The errors 0 to 25 are those of public networks; these follow them.
constexpr Error privateErrors[] = {
    {1000, "temporarily unavailable"},
    {1001, "collision"},
    {1002, "criteria cannot be met"},
    {1003, "criteria cannot be met for now"},
    {1004, "invalid rerouteing number"},
    {1005, "unknown call identity"},
    {1006, "establishment failed"},
    {1007, "not authorized"},
    {1008, "unspecified"},
    {1009, "not busy"},
    {1010, "rejected for a short time"},
    {1011, "rejected for a long time"},
    {1012, "remote user busy again"},
    {1013, "no match"},
    {1014, "failed because of interworking"},
    {1015, "location not known"},
    {1016, "free of charge"},
    {1017, "parameter not available"},
};

constexpr std::array<std::string_view, 3> generalProblems{"unrecognized component", "mistyped component",
                                                          "badly structured component"};
constexpr std::array<std::string_view, 8> invokeProblems{
    "duplicate invocation",       "unrecognized operation",     "mistyped argument",
    "resource limitation",        "release is in progress",     "unrecognized linked id",
    "linked response unexpected", "unexpected linked operation"};
constexpr std::array<std::string_view, 3> resultProblems{"unrecognized invocation", "unexpected result",
                                                         "mistyped result"};
constexpr std::array<std::string_view, 5> errorProblems{
    "unrecognized invocation", "unexpected error", "unrecognized error",
    "error not expected of this operation", "mistyped parameter"};

template <std::size_t n>
std::string_view at(const std::array<std::string_view, n>& names, std::int64_t number) {
    if (number < 0 || static_cast<std::uint64_t>(number) >= n)
        return {};
    return names[static_cast<std::size_t>(number)];
}

const Operation* find(std::span<const Operation> operations, const Code& code) {
    const auto found = std::ranges::find_if(operations, [&](const Operation& operation) {
        return code.local ? *code.local >= 0 && operation.local == *code.local
                          : !code.global.empty() && operation.global == code.global;
    });
    return found == operations.end() ? nullptr : &*found;
}

}  // namespace

std::string toString(const Code& code) { return code.local ? std::to_string(*code.local) : code.global; }

const Operation* findOperation(Family family, const Code& code) {
    if (family == Family::privateNetwork) {
        if (const Operation* found = find(privateOperations, code))
            return found;
        return code.local ? nullptr : find(northAmericanOperations, code);
    }
    return family == Family::etsi ? find(etsiOperations, code) : find(northAmericanOperations, code);
}

std::string_view errorName(Family family, const Code& code) {
    if (!code.local)
        return {};
    const auto named = [&](std::span<const Error> errors) {
        const auto found = std::ranges::find(errors, *code.local, &Error::number);
        return found == errors.end() ? std::string_view() : found->name;
    };
    if (family == Family::privateNetwork && *code.local >= 1000)
        return named(privateErrors);
    return family == Family::northAmerica ? std::string_view() : named(etsiErrors);
}

std::string_view problemName(std::uint32_t kind, std::int64_t problem) {
    switch (kind) {
        case 0:
            return at(generalProblems, problem);
        case 1:
            return at(invokeProblems, problem);
        case 2:
            return at(resultProblems, problem);
        case 3:
            return at(errorProblems, problem);
        default:
            return {};
    }
}

std::string_view profileName(std::uint8_t profile) {
    switch (profile) {
        case 0x11:
            return "remote operations";
        case 0x12:
            return "CMIP";
        case 0x13:
            return "ACSE";
        case 0x1F:
            return "networking extensions";
        default:
            return {};
    }
}

}  // namespace isdn::facility
