// lapdread convert: writes frames into files for other tools.
#ifndef READER_CONVERT_H
#define READER_CONVERT_H

#include <span>

#include "reader/OptionRow.h"

namespace reader {

std::span<const OptionRow> convertOptions();
int runConvert(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
