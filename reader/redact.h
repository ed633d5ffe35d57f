// lapdread redact: writes frames without what identifies a person.
#ifndef READER_REDACT_H
#define READER_REDACT_H

#include <span>

#include "reader/Chatter.h"
#include "reader/OptionRow.h"
#include "redaction/Key.h"

namespace reader {

std::span<const OptionRow> redactOptions();
// Reads the key file that the options name. If the file does not exist, makes it and says so; if the options
// name none, makes a random key that is not stored. Throws UsageError, FileError or redaction::KeyError.
redaction::Key redactionKey(const Options& options, Chatter& chatter);

int runRedact(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
