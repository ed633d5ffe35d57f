// Where the relay's log goes.
#ifndef RELAY_LOG_H
#define RELAY_LOG_H

#include <functional>
#include <string>

namespace relay {

// Writes one line, which is given without its line end. Any thread calls it.
using Log = std::function<void(const std::string&)>;

}  // namespace relay

#endif
