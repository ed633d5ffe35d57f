// From the items of a run to the analysis of calls.
#ifndef READER_FEED_H
#define READER_FEED_H

#include "calls/Analysis.h"
#include "reader/Options.h"
#include "reader/Seen.h"

namespace reader {

// What the command line asks of an analysis.
calls::Options analysisOptions(const Options& options);

// Tells an analysis, or a redaction::TraceRedactor, what the recorder had to say between frames.
template <typename Hearer>
void tell(Hearer& hearer, const capture::Item& item);
// Hands a frame on, or what the recorder says.
void feed(calls::Analysis& analysis, const Seen& seen);

}  // namespace reader

#endif
