// Starts a program on the software board.
#ifndef SOFTBOARD_LAUNCH_H
#define SOFTBOARD_LAUNCH_H

#include <filesystem>
#include <string>
#include <vector>

#include "softboard/scenario.h"

namespace softboard {

// Replaces this process by the program, with the library and the scenario in its environment. `self` is the
// path of the launcher. The library is in ../lib/lapdmon, seen from the launcher's folder. A program that is
// named without a slash is looked for in the launcher's folder first, then on PATH.
//
// Returns only when the program could not be started: the exit status, after a line on the standard error
// stream. Throws BadInput when the journal cannot be written or the library is missing.
int launch(const std::filesystem::path& self, const Scenario& scenario,
           const std::vector<std::string>& program);

}  // namespace softboard

#endif
