// Hands the items of a run to the analysis of calls.
#ifndef READER_FEED_H
#define READER_FEED_H

#include <string_view>

#include "calls/Analysis.h"
#include "reader/Options.h"
#include "reader/Seen.h"

namespace reader {

// The options for the analysis that the command line asks for.
calls::Options analysisOptions(const Options& options);

// Why frames may be missing where an item of this kind stands, in a few words; empty if none are missing.
std::string_view reasonOf(capture::Item::Kind kind);

// Tells an analysis, or a redaction::TraceRedactor, what the recorder says between frames.
template <typename Hearer>
void tell(Hearer& hearer, const capture::Item& item);
// Hands a frame to the analysis, or tells it what the recorder says.
void feed(calls::Analysis& analysis, const Seen& seen);

}  // namespace reader

#endif
