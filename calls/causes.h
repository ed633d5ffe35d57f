// Where a cause was made, and what it says about the call.
#ifndef CALLS_CAUSES_H
#define CALLS_CAUSES_H

#include <string_view>

#include "calls/Call.h"

namespace calls {

// Where a cause was made, as its sender says (Q.850 2.2.3; equipment often codes locations wrongly).
enum class Made : std::uint8_t {
    unknown,       // whether the sender is the user or the network is not known
    here,          // by the sender, on this interface
    thisExchange,  // the exchange at the other end of this interface
    beyond,        // a network behind this one
    farUser,       // the user at the far end, or a private network there
    interworking,  // behind a point where signalling ends
    behindUser,    // relayed by the user side from behind it
    unclear
};
Made madeBy(const CauseGiven& cause);
// "made here", "this exchange", ...; empty for unknown.
std::string_view nameOf(Made made);

// What a cause says about an unanswered call. A cause of another coding standard says nothing.
Outcome outcomeOf(const CauseGiven& cause);

}  // namespace calls

#endif
