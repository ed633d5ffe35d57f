// A connection ends. what() is the reason as the log shows it.
#ifndef RELAY_ENDED_H
#define RELAY_ENDED_H

#include <stdexcept>

namespace relay {

class Ended : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

}  // namespace relay

#endif
