// Waits for what ends a trace: the operator's "q", a signal, or the loss of the board.
#ifndef APP_OPERATOR_H
#define APP_OPERATOR_H

#include <poll.h>

namespace app {

// Installs the signal handler. From now on a signal has an effect that depends on the state of the trace:
//
//                                SIGINT, SIGTERM                     SIGHUP
//     the trace runs             ends the trace (awaitQuit returns)  ends the trace
//     the shutdown runs          ends the process as signals do      nothing
//     the shutdown writes out    gives up writing                    nothing
//     and has given that up      ends the process as signals do      nothing
//
// A terminal that closes sends SIGHUP twice, and that must not end the shutdown. A SIGHUP that was ignored
// when the program started, as nohup does, stays ignored. If the pipe that wakes awaitQuit cannot be made,
// the signals keep their old effect.
void watchSignals();

// Call it when the shutdown begins, whatever has caused it.
void shutdownBegins();

// While an object of this class exists, the shutdown writes the records that wait.
class WritingOut {
  public:
    WritingOut();
    ~WritingOut();
    WritingOut(const WritingOut&) = delete;
    WritingOut& operator=(const WritingOut&) = delete;
};

// True once a signal has given up that writing. The log then takes only text for which its file has room at
// once, and records that still wait must be counted and dropped. Any thread may call it.
bool shutdownHurried();

enum class Ending { asked, boardLost };

// Waits until "q" is read from the standard input, a signal comes, or boardLost is called. After any other
// character it does not read for 10 seconds. After the end of the input only a signal or boardLost ends the
// wait.
// `wait` waits for descriptors as poll does.
using Poll = int (*)(pollfd* waited, nfds_t count, int timeoutMs);
Ending awaitQuit(Poll wait = ::poll);

// Call it when the board cannot be reached any more. Any thread may call it after watchSignals has returned.
void boardLost();

// The signal handler.
void exit_handle(int signal);

}  // namespace app

#endif
