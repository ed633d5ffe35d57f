// What is wrong with links, calls and channels.
#ifndef READER_CHECK_H
#define READER_CHECK_H

#include <span>

#include "reader/OptionRow.h"
#include "reader/Options.h"

namespace reader {

// "note", "warning", "error". Throws UsageError.
calls::Severity severityNamed(const std::string& name);

class Chatter;

// Returns `found` if a finding is as severe as --fail-on says.
int runCheck(const Options& options, Chatter& chatter);
std::span<const OptionRow> checkOptions();

}  // namespace reader

#endif
