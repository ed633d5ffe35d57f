// The figures of a shipper, for Prometheus.
#ifndef FLEET_SHIP_SHIPMETRICS_H
#define FLEET_SHIP_SHIPMETRICS_H

#include <string>

namespace fleet {

class Shipper;

// docs/user/fleet-metrics.md says what each figure means. Called on the shipper's thread.
std::string metricsOf(const Shipper& shipper);

}  // namespace fleet

#endif
