// lapdread record: writes what is followed into files, and begins a new file by size or time.
#ifndef READER_RECORD_H
#define READER_RECORD_H

#include <span>
#include <string>

#include "reader/OptionRow.h"

namespace reader {

// Reads a size in octets: "500k", "100M", "2G", in powers of 1000. Throws UsageError.
std::uint64_t readSize(const std::string& text);
// Reads a period: "90s", "15min", "1h", "1d". Returns seconds. Throws UsageError.
std::int64_t readPeriod(const std::string& text);

std::span<const OptionRow> recordOptions();
int runRecord(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
