// lapdread diff: shows what differs between two calls, or two traces.
#ifndef READER_DIFF_H
#define READER_DIFF_H

#include <span>

#include "reader/Chatter.h"
#include "reader/OptionRow.h"
#include "reader/Options.h"

namespace reader {

std::span<const OptionRow> diffOptions();
int runDiff(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
