// The one network of the process, made on first use.
#ifndef SOFTBOARD_PROCESS_H
#define SOFTBOARD_PROCESS_H

#include "softboard/network.h"

namespace softboard {

// The first call makes the network, with the scenario that the launcher handed over or the built-in one. It
// ends the process when the scenario cannot be read. The network is never destroyed, because threads of the
// program may wait in a queue until the process ends.
Network& network();

// Says so on the standard error stream, once, unless the launcher has started the program: a program that
// finds this library by itself may be meant for real boards. Any thread.
void sayThatBoardsAreSimulated();

}  // namespace softboard

#endif
