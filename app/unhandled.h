// The end of a process that nobody expected.
#ifndef APP_UNHANDLED_H
#define APP_UNHANDLED_H

namespace app {

// From here on an exception that no thread handles closes the log, is named on the standard error stream with
// the place that it left, and ends the process with status 1.
void closeLogWhenUnhandled();

}  // namespace app

#endif
