// Puts findings together.
#ifndef CALLS_FINDINGOF_H
#define CALLS_FINDINGOF_H

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

}  // namespace calls

#endif
