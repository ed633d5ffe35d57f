// What every program says of itself.
#ifndef FLEET_METRICS_PROCESS_H
#define FLEET_METRICS_PROCESS_H

#include <cstdint>
#include <string>

#include "fleet/metrics/Exposition.h"

namespace fleet {

// Since 1970.
std::int64_t nanosecondsNow();

// The version ("lapdship_build_info"), and when the process began ("process_start_time_seconds").
void describeProcess(Exposition& to, const std::string& program, const std::string& version);

}  // namespace fleet

#endif
