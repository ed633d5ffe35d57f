// lapdread check: shows what is wrong with links, calls and channels.
#ifndef READER_CHECK_H
#define READER_CHECK_H

#include <span>

#include "reader/OptionRow.h"
#include "reader/Options.h"

namespace reader {

// Reads "note", "warning" or "error". Throws UsageError for anything else.
calls::Severity severityNamed(const std::string& name);

class Chatter;

// Returns the exit status `found` if a finding has the severity of --fail-on or a worse one.
int runCheck(const Options& options, Chatter& chatter);
std::span<const OptionRow> checkOptions();

}  // namespace reader

#endif
