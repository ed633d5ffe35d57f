// Makes the standard streams safe to use: open, and without waiting for their readers.
#ifndef APP_STANDARD_STREAMS_H
#define APP_STANDARD_STREAMS_H

namespace app {

// Opens /dev/null for each standard stream that is closed. Otherwise the next files that are opened would get
// the numbers of these streams, and reports would go into the log or into the pipe that tells of signals.
void openStandardStreams();

// Ignores SIGPIPE and SIGXFSZ, so that a screen or a log that nobody reads any more, or that reaches the
// limit of its size, does not end the process.
void outliveOutput();

// From now on a StreamWriter writes std::cout and std::cerr, so that no thread waits for their readers. A
// text goes to it when a thread ends a line or flushes, so that lines of several threads do not mix. When the
// process exits or aborts, text that still waits has at most a second to be written. Call it once, before
// there is another thread, with SIGPIPE ignored. If the system refuses the thread, the streams stay as they
// are.
void decoupleStandardStreams();

// Waits until all text is written, at most a second. For signal handlers that end the process.
void awaitStandardStreams();

// Does at once what decoupleStandardStreams does at exit, for an end of the process that skips the exit
// handlers. Later texts are written directly, if the stream has room for them.
void endStandardStreams();

}  // namespace app

#endif
