// Hands the items of a run to the analysis of calls.
#ifndef READER_FEED_H
#define READER_FEED_H

#include "calls/Analysis.h"
#include "reader/Options.h"
#include "reader/Seen.h"

namespace reader {

// The options for the analysis that the command line asks for.
calls::Options analysisOptions(const Options& options);

// Hands a frame to the analysis, or tells it what the recorder says.
void feed(calls::Analysis& analysis, const Seen& seen);

}  // namespace reader

#endif
