// Builds findings.
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
// The finding belongs to the frame of `message`. `call` may be null.
Finding findingOf(const FindingKind& kind, const Message& message, const Call* call, std::string sentence);
// The finding belongs to an earlier frame of `call`.
Finding findingOf(const FindingKind& kind, const Moment& moment, const Call& call, std::string sentence);

// "1, 2, 5". A long list ends early: "1, 2, 5 and 40 more".
std::string listOf(std::span<const std::string> words);

}  // namespace calls

#endif
