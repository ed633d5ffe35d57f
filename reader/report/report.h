// lapdread report: one page that shows a trace to people.
#ifndef READER_REPORT_REPORT_H
#define READER_REPORT_REPORT_H

#include <span>

#include "reader/Chatter.h"
#include "reader/OptionRow.h"
#include "reader/Options.h"

namespace reader {

std::span<const OptionRow> reportOptions();
int runReport(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
