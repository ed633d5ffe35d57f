#include "app/operator.h"

#include <fcntl.h>
#include <unistd.h>

#include <array>
#include <atomic>
#include <cerrno>
#include <csignal>

#include "app/Log.h"
#include "app/standard_streams.h"

namespace app {

namespace {

constexpr std::array signals{SIGINT, SIGTERM, SIGHUP};
constexpr int pauseMs = 10000;
constexpr int forEver = -1;

// The pipe that ends the wait: the end that awaitQuit reads, and the end that the signal handler writes.
std::array<int, 2> signalled{-1, -1};

std::atomic<bool> lost = false;

enum class State { tracing, shuttingDown, writingOut };
std::atomic<State> state = State::tracing;
std::atomic<bool> hurried = false;
static_assert(std::atomic<State>::is_always_lock_free, "a signal handler uses it");

// Changes the state from `from` to `to`. Returns false when it was another one.
bool moveOn(State from, State to) { return state.compare_exchange_strong(from, to); }

void wakeWaiter() {
    const char mark = 's';
    static_cast<void>(!write(signalled[1], &mark, 1));
}

// Waits until a signal comes or the board is lost, until the input can be read, or until the time is over.
// Returns true in the first two cases. With input -1 it does not watch the input.
bool awaitSignal(Poll wait, int timeoutMs, int input) {
    std::array<pollfd, 2> waited{pollfd{signalled[0], POLLIN, 0}, pollfd{input, POLLIN, 0}};
    while (wait(waited.data(), waited.size(), timeoutMs) < 0 && errno == EINTR) {
    }
    return waited[0].revents != 0;
}

}  // namespace

void exit_handle(int signal) {
    const int saved = errno;
    if (moveOn(State::tracing, State::shuttingDown)) {
        wakeWaiter();
    } else if (signal == SIGHUP) {  // the shutdown runs already, and this signal must not end it
    } else if (moveOn(State::writingOut, State::shuttingDown)) {
        hurried = true;
        traceLog.giveUp();
    } else {
        awaitStandardStreams();
        static_cast<void>(std::signal(signal, SIG_DFL));
        static_cast<void>(raise(signal));  // takes effect when the handler returns
    }
    errno = saved;
}

void shutdownBegins() { moveOn(State::tracing, State::shuttingDown); }

WritingOut::WritingOut() { moveOn(State::shuttingDown, State::writingOut); }

WritingOut::~WritingOut() { moveOn(State::writingOut, State::shuttingDown); }

bool shutdownHurried() { return hurried; }

void watchSignals() {
    if (pipe2(signalled.data(), O_CLOEXEC | O_NONBLOCK) != 0)
        return;  // the signals keep their default and end the process
    struct sigaction action = {};
    action.sa_handler = exit_handle;
    action.sa_flags = SA_RESTART;
    for (const int each : signals) {
        struct sigaction before = {};
        sigaction(each, nullptr, &before);
        if (each != SIGHUP || before.sa_handler != SIG_IGN)
            sigaction(each, &action, nullptr);
    }
}

void boardLost() {
    lost = true;
    wakeWaiter();
}

namespace {

// Waits until a "q" is read or the pipe is written to.
void awaitEnd(Poll wait) {
    constexpr int noInput = -1;
    int input = STDIN_FILENO;
    while (!awaitSignal(wait, forEver, input)) {
        char typed = 0;
        const ssize_t got = read(STDIN_FILENO, &typed, 1);
        if (got == 1 && typed == 'q')
            return;
        if (got == 0 || (got < 0 && errno != EINTR && errno != EAGAIN))
            input = noInput;
        if (awaitSignal(wait, pauseMs, noInput))
            return;
    }
}

}  // namespace

Ending awaitQuit(Poll wait) {
    awaitEnd(wait);
    return lost ? Ending::boardLost : Ending::asked;
}

}  // namespace app
