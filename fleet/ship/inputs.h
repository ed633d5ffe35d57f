// Opens recordings and logs.
#ifndef FLEET_SHIP_INPUTS_H
#define FLEET_SHIP_INPUTS_H

#include <memory>
#include <string>

#include "capture/Reader.h"

namespace fleet {

enum class Manner : std::uint8_t { readOnce, follow };

// Opens an input of any form that a recorder writes. If `trunk` is not empty, it is the D channel's name in
// place of the one that the input gives. Throws capture::BadInput.
std::unique_ptr<capture::Reader> openInput(const std::string& path, Manner manner,
                                           const std::string& trunk = {});

}  // namespace fleet

#endif
