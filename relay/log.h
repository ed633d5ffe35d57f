#ifndef RELAY_LOG_H
#define RELAY_LOG_H

#include <functional>
#include <string>

namespace relay {

// Takes one line, without its end. Called on any thread.
using Log = std::function<void(const std::string&)>;

}  // namespace relay

#endif
