// What ends a trace: the operator's "q", or a signal.
#ifndef APP_OPERATOR_H
#define APP_OPERATOR_H

namespace app {

// From here on SIGINT, SIGTERM and SIGHUP end awaitQuit instead of the process. Only the first of them: the
// next one finds the system's own behaviour, so that a shutdown that hangs can be ended. A SIGHUP that was
// ignored from the start, under nohup, stays so.
void watchSignals();

// A screen that nobody reads any more must not end the process, least of all its shutdown.
void outliveScreen();

// Returns once "q" was read from standard input or a signal came. Any other character is followed by a pause
// of 10 seconds before the next is read; at the end of input only a signal is left.
void awaitQuit();

// The signal handler.
void exit_handle(int signal);

}  // namespace app

#endif
