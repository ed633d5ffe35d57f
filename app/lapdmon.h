// One trace from start to stop.
#ifndef APP_LAPDMON_H
#define APP_LAPDMON_H

#include <memory>

#include "vela/CCS.h"

namespace app {

// The CCS instance of the traced D channel, from when the board reports its frames until quit.
extern std::unique_ptr<vela::CCS> ccs;

// Runs a trace until the operator ends it; returns the process's exit status.
int runTrace(int argc, char** argv);

// The orderly shutdown of a trace that is on, else nothing. Run by runTrace, and at process exit for whoever
// leaves another way. Never throws: what fails is reported, and the next step goes on, so that the log is
// always closed.
void quit();

}  // namespace app

#endif
