// lapdread ladder: shows the messages of calls as arrows between both sides.
#ifndef READER_LADDER_H
#define READER_LADDER_H

#include <span>

#include "reader/OptionRow.h"
#include "reader/Options.h"

namespace reader {

class Chatter;

std::span<const OptionRow> ladderOptions();
int runLadder(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
