// lapdread calls: lists the calls, one a line.
#ifndef READER_CALLS_H
#define READER_CALLS_H

#include <span>

#include "reader/OptionRow.h"
#include "reader/Options.h"

namespace reader {

class Chatter;

std::span<const OptionRow> callsOptions();
int runCalls(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
