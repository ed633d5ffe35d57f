// lapdread stats: shows figures of messages, causes, times, calls and channels.
#ifndef READER_STATS_H
#define READER_STATS_H

#include <span>

#include "reader/Chatter.h"
#include "reader/OptionRow.h"
#include "reader/Options.h"

namespace reader {

std::span<const OptionRow> statsOptions();
int runStats(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
