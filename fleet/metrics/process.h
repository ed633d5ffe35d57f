// Figures that every program of a fleet gives about itself.
#ifndef FLEET_METRICS_PROCESS_H
#define FLEET_METRICS_PROCESS_H

#include <cstdint>
#include <string>

#include "fleet/metrics/Exposition.h"

namespace fleet {

// The time of day, in nanoseconds since 1970.
std::int64_t nanosecondsNow();

// Adds the program's version ("lapdship_build_info") and the time at which the process began
// ("process_start_time_seconds").
void describeProcess(Exposition& to, const std::string& program, const std::string& version);

}  // namespace fleet

#endif
