// What ends a trace: the operator's "q", a signal, or a board that is lost.
#ifndef APP_OPERATOR_H
#define APP_OPERATOR_H

namespace app {

// From here on a signal does what the trace's state calls for:
//
//                                SIGINT, SIGTERM                     SIGHUP
//     the trace runs             ends the trace (awaitQuit returns)  ends the trace
//     the shutdown runs          ends the process as signals do      nothing
//     the shutdown writes out    gives up writing                    nothing
//     and has given that up      ends the process as signals do      nothing
//
// A terminal that closes sends SIGHUP twice, which must not end the shutdown. A SIGHUP that was ignored from
// the start, under nohup, stays ignored. Without a pipe to wake awaitQuit, all three keep what they did
// before.
void watchSignals();

// The shutdown runs from here on, also when no signal began it.
void shutdownBegins();

// While one lives, the shutdown writes out what waits.
class WritingOut {
  public:
    WritingOut();
    ~WritingOut();
    WritingOut(const WritingOut&) = delete;
    WritingOut& operator=(const WritingOut&) = delete;
};

// True once a signal has given up writing: the log takes only what its file has room for, and what still
// waits for it is to be counted and dropped. From any thread.
bool shutdownHurried();

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
