#include <fcntl.h>
#include <sys/resource.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <iostream>
#include <sstream>

#include "norv/norv.h"
#include "relay/command_line.h"
#include "relay/server.h"
#include "service/notify.h"

namespace {

constexpr int badCommandLine = 2;

// Writes a line with one system call, so that lines of several threads do not mix.
void logLine(const std::string& line) {
    const std::string whole = "kv9relayd: " + line + "\n";
    static_cast<void>(!write(STDERR_FILENO, whole.data(), whole.size()));
}

// Blocks SIGTERM and SIGINT in this thread and in all threads that it starts later, and returns a descriptor
// from which they are read.
relay::Descriptor awaitedSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGINT);
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    return relay::Descriptor(signalfd(-1, &signals, SFD_CLOEXEC | SFD_NONBLOCK));
}

// Ignores SIGPIPE, so that a log that nobody reads any more does not end the relay. Opens /dev/null for each
// standard stream that is closed; otherwise a connection would get the stream's number, and the lines of the
// log.
void outliveStreams() {
    for (const int each : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        if (fcntl(each, F_GETFD) < 0)
            static_cast<void>(open("/dev/null", O_RDWR));  // open() takes the lowest free number: `each`
    }
    static_cast<void>(std::signal(SIGPIPE, SIG_IGN));
}

// Raises the limit of open files to the hard limit: each connection takes a descriptor, and the transport
// library may take another for its queue.
void allowMoreOpenFiles() {
    rlimit limit{};
    if (getrlimit(RLIMIT_NOFILE, &limit) == 0) {
        limit.rlim_cur = limit.rlim_max;
        setrlimit(RLIMIT_NOFILE, &limit);
    }
}

void serve(const relay::Options& options) {
    const relay::Descriptor signals = awaitedSignals();
    allowMoreOpenFiles();
    if (nvDrvSetInterface(0, 0) != NVSTATUS_OK)
        throw std::runtime_error("the transport library does not start");
    relay::Server server(options, logLine);
    std::cout << "kv9relayd: listening on " << server.endpoint().text() << std::endl;
    service::notify("READY=1");
    server.run(signals.get(), [] { service::notify("STOPPING=1"); });
}

}  // namespace

int main(int argc, char** argv) {
    outliveStreams();
    try {
        const relay::CommandLine commandLine = relay::parseCommandLine(argc, argv);
        if (!commandLine.told.empty())
            std::cout << commandLine.told;
        else
            serve(commandLine.options);
        return EXIT_SUCCESS;
    } catch (const relay::BadCommandLine& error) {
        logLine(error.what());
        return badCommandLine;
    } catch (const std::exception& error) {
        logLine(error.what());
        return EXIT_FAILURE;
    }
}
