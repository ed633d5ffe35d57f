// Runs one trace, from start to stop.
#ifndef APP_LAPDMON_H
#define APP_LAPDMON_H

#include <memory>

#include "vela/CCS.h"

namespace app {

// The CCS instance of the traced D channel. It is set while the board reports frames, and quit() destroys it.
extern std::unique_ptr<vela::CCS> ccs;

// Runs a trace until the operator ends it; returns the process's exit status.
int runTrace(int argc, char** argv);

// Shuts a running trace down in order; does nothing if there is none. runTrace calls it, and the process's
// exit does if it is left another way. It never throws: a step that fails is reported, and the next one goes
// on, so that the log is always closed.
void quit();

}  // namespace app

#endif
