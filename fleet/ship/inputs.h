// Recordings and logs, opened.
#ifndef FLEET_SHIP_INPUTS_H
#define FLEET_SHIP_INPUTS_H

#include <memory>
#include <string>

#include "capture/Reader.h"

namespace fleet {

enum class Manner : std::uint8_t { readOnce, follow };

// An input of any form that a recorder writes. `trunk` names its D channel, in place of what it says itself,
// unless it is empty. Throws capture::BadInput.
std::unique_ptr<capture::Reader> openInput(const std::string& path, Manner manner,
                                           const std::string& trunk = {});

}  // namespace fleet

#endif
