// The one network of the process, made on first use.
#ifndef SOFTBOARD_PROCESS_H
#define SOFTBOARD_PROCESS_H

#include "softboard/network.h"

namespace softboard {

// Plays the scenario that the launcher left, or the built-in one. Never destroyed: threads of the program may
// wait in a queue until the very end.
Network& network();

}  // namespace softboard

#endif
