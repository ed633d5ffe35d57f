// lapdread browse: screens in a terminal for trunks, calls, ladders, messages and findings.
#ifndef READER_BROWSE_BROWSE_H
#define READER_BROWSE_BROWSE_H

#include <span>

#include "reader/OptionRow.h"

namespace reader {

int runBrowse(const Options& options, Chatter& chatter);
std::span<const OptionRow> browseOptions();

}  // namespace reader

#endif
