// Frames without what names a person.
#ifndef READER_REDACT_H
#define READER_REDACT_H

#include <span>

#include "reader/OptionRow.h"

namespace reader {

std::span<const OptionRow> redactOptions();
int runRedact(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
