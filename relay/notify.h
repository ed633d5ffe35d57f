#ifndef RELAY_NOTIFY_H
#define RELAY_NOTIFY_H

#include <string>

namespace relay {

// Tells the service manager, where there is one (NOTIFY_SOCKET): "READY=1", "STOPPING=1".
void notify(const std::string& state);

}  // namespace relay

#endif
