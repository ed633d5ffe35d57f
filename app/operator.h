// What ends a trace: the operator's "q", a signal, or a board that is lost.
#ifndef APP_OPERATOR_H
#define APP_OPERATOR_H

namespace app {

// From here on SIGINT, SIGTERM and SIGHUP end awaitQuit instead of the process. Only the first of them: the
// next one finds the system's own behaviour, so that a shutdown that hangs can be ended. A SIGHUP that was
// ignored from the start, under nohup, stays so.
void watchSignals();

// Standard streams that are closed lead nowhere from here on. Otherwise the next files that are opened would
// take their numbers: reports would end up in the log, or wake whoever waits for a signal.
void openStandardStreams();

// A screen or a log that nobody reads any more, or that grows past the limit of its size, must not end the
// process, least of all its shutdown.
void outliveOutput();

enum class Ending { Asked, BoardLost };

// Returns once "q" was read from standard input, a signal came, or boardLost was called. Any other character
// is followed by a pause of 10 seconds before the next is read; at the end of input only the others are left.
Ending awaitQuit();

// The board cannot be reached any more. From any thread, once watchSignals has returned.
void boardLost();

// The signal handler.
void exit_handle(int signal);

}  // namespace app

#endif
