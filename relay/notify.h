// Readiness for a service manager.
#ifndef RELAY_NOTIFY_H
#define RELAY_NOTIFY_H

#include <string>

namespace relay {

// Sends "READY=1" or "STOPPING=1" to the service manager that NOTIFY_SOCKET names. Does nothing without one.
void notify(const std::string& state);

}  // namespace relay

#endif
