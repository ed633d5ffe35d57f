// Starting a program on the software board.
#ifndef SOFTBOARD_LAUNCH_H
#define SOFTBOARD_LAUNCH_H

#include <filesystem>
#include <string>
#include <vector>

#include "softboard/scenario.h"

namespace softboard {

// Becomes the program. `self` is the launcher's own path: the library stands in ../lib/lapdmon beside it, and
// a program named without a slash may stand there too. Returns the exit status, having said why, only when
// the program could not be started; throws BadInput when the journal or the library is at fault.
int launch(const std::filesystem::path& self, const Scenario& scenario,
           const std::vector<std::string>& program);

}  // namespace softboard

#endif
