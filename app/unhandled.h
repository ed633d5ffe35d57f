// Ends the process in order after an exception that no thread handles.
#ifndef APP_UNHANDLED_H
#define APP_UNHANDLED_H

namespace app {

// From now on, when no thread handles an exception, the log is closed, the exception and the place that it
// left are named on the standard error stream, and the process ends with status 1.
void closeLogWhenUnhandled();

}  // namespace app

#endif
