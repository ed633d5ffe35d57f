// A finding in words.
#ifndef READER_FINDINGTEXT_H
#define READER_FINDINGTEXT_H

#include <string>

#include "calls/Finding.h"
#include "reader/TimeText.h"

namespace reader {

// "2026-11-21T11:25:33.300+01:00 frame 17 call 3 link-refused: ...", with "-" in place of a time that is not
// known. Where there may be several D channels, its name stands behind the time. Control characters are made
// harmless.
void appendHappening(std::string& to, const calls::Finding& finding, TimeText& times,
                     bool severalDChannels = false);
// Appends what the finding means, what to look at, and the clause of the standard.
void appendMeaning(std::string& to, const calls::Finding& finding);

}  // namespace reader

#endif
