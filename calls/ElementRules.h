// The rules for the elements of a message: which it must have, and which may occur more than once (Q.931 3.1,
// 4.5).
#ifndef CALLS_ELEMENTRULES_H
#define CALLS_ELEMENTRULES_H

#include <string>
#include <vector>

#include "calls/FindingKinds.h"
#include "calls/Message.h"

namespace calls {

// A broken rule: its kind, and the case in words.
struct BrokenRule {
    const FindingKind* kind;
    std::string sentence;
    bool ifFirst = false;  // it is broken only if no earlier message has cleared the call
};

// Returns the rules that the message breaks. It must be a message of call control or maintenance.
// `clearsFirst`: it is the first message that clears its call, and so must name a cause.
std::vector<BrokenRule> brokenElementRules(const Message& message, bool clearsFirst);

}  // namespace calls

#endif
