// Frames without what names a person.
#ifndef READER_REDACT_H
#define READER_REDACT_H

#include <span>

#include "reader/Chatter.h"
#include "reader/OptionRow.h"
#include "redaction/Key.h"

namespace reader {

std::span<const OptionRow> redactOptions();
// The key that the options name, or one that nobody keeps. Makes the file if there is none, and says so.
// Throws UsageError, FileError or redaction::KeyError.
redaction::Key redactionKey(const Options& options, Chatter& chatter);

int runRedact(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
