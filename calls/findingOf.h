// Puts findings together.
#ifndef CALLS_FINDINGOF_H
#define CALLS_FINDINGOF_H

#include <span>
#include <string>

#include "calls/Call.h"
#include "calls/Finding.h"
#include "calls/Message.h"

namespace calls {

Finding findingOf(const FindingKind& kind, const Moment& moment, const std::string& dChannel,
                  std::string sentence);
// Of the message that shows it. `call` may be null.
Finding findingOf(const FindingKind& kind, const Message& message, const Call* call, std::string sentence);
// Of an earlier frame of a call.
Finding findingOf(const FindingKind& kind, const Moment& moment, const Call& call, std::string sentence);

// "1, 2, 5", and of a long list "1, 2, 5 and 40 more".
std::string listOf(std::span<const std::string> words);

}  // namespace calls

#endif
