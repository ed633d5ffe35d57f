// The program's standard streams: open, and never waited for.
#ifndef APP_STANDARD_STREAMS_H
#define APP_STANDARD_STREAMS_H

namespace app {

// Standard streams that are closed lead nowhere from here on. Otherwise the next files that are opened would
// take their numbers: reports would end up in the log, or wake whoever waits for a signal.
void openStandardStreams();

// A screen or a log that nobody reads any more, or that grows past the limit of its size, must not end the
// process, least of all its shutdown.
void outliveOutput();

// From here on nobody who writes to std::cout or std::cerr waits for their readers: a StreamWriter writes
// both. A text goes to it when a thread ends a line or flushes, so that lines of several threads do not mix.
// What still waits when the process exits, or aborts, is waited for at most a second. To be called once,
// before there is another thread, while SIGPIPE is ignored. Where there is no thread, the streams stay as
// they are.
void decoupleStandardStreams();

// Waits until what was said is written, at most a second. For signal handlers that end the process.
void awaitStandardStreams();

// What decoupleStandardStreams does at exit, for whoever leaves without that. Later texts are written at
// once, if the stream has room for them.
void endStandardStreams();

}  // namespace app

#endif
