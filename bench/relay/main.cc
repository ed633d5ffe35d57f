// Measures what the relay costs: events a second and the time of a reply, with the queue of this machine and
// through a relay on loopback, in one run. Run it on the software board:
//
//     softboard --rate max --loop -- bench-relay [SECONDS]
//
// The relay runs in the same process as the board and the host, and shares the processors with them.
#include <sys/eventfd.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <iomanip>
#include <iostream>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "bench/arguments.h"
#include "bench/host.h"
#include "hostsvc/KSLocalMsgQueue.h"
#include "hostsvc/KSRemoteMsgQueue.h"
#include "relay/server.h"

namespace {

using bench::Host;
using Clock = std::chrono::steady_clock;
using Microseconds = std::chrono::duration<double, std::micro>;

class BackgroundRelay {
  public:
    BackgroundRelay()
        : server_({{0x7F000001, 0}}, [](const std::string&) {}),
          thread_([this] { server_.run(stop_.get()); }) {}
    ~BackgroundRelay() {
        eventfd_write(stop_.get(), 1);
        thread_.join();
    }
    std::string host() const { return server_.endpoint().text(); }

  private:
    relay::Descriptor stop_{eventfd(0, EFD_CLOEXEC)};
    relay::Server server_;
    std::thread thread_;
};

struct Figures {
    double eventsPerSecond;
    double median;  // time of a reply, in microseconds
    double percentile99;
};

void measureAnswers(Host& host, std::chrono::duration<double> time, Figures& figures) {
    std::vector<double> took;
    const auto end = Clock::now() + time;
    while (Clock::now() < end) {
        const auto asked = Clock::now();
        host.askProtocol();
        took.push_back(Microseconds(Clock::now() - asked).count());
    }
    std::sort(took.begin(), took.end());
    figures.median = took[took.size() / 2];
    figures.percentile99 = took[took.size() * 99 / 100];
}

void measureEvents(Host& host, std::chrono::duration<double> time, Figures& figures) {
    host.startTrace();
    const auto start = Clock::now();
    unsigned long count = 0;
    while (Clock::now() - start < time)
        count += host.hearEvent() ? 1 : 0;
    figures.eventsPerSecond =
        static_cast<double>(count) / std::chrono::duration<double>(Clock::now() - start).count();
    host.endTrace();
}

Figures measure(std::unique_ptr<KSAbstractMsgQueue> queue, double seconds) {
    Host host(std::move(queue));
    Figures figures{};
    measureAnswers(host, std::chrono::duration<double>(seconds), figures);
    measureEvents(host, std::chrono::duration<double>(seconds), figures);
    return figures;
}

void print(const char* way, const Figures& figures) {
    std::cout << std::left << std::setw(8) << way << std::right << std::fixed << std::setprecision(0)
              << std::setw(12) << figures.eventsPerSecond << std::setprecision(1) << std::setw(16)
              << figures.median << std::setw(16) << figures.percentile99 << '\n';
}

}  // namespace

int main(int argc, char** argv) {
    const double seconds = argc > 1 ? bench::numberIn(argv[1], 0.01, 3600.0).value_or(0) : 2;
    if (seconds == 0 || argc > 2) {
        std::cerr << "syntax: bench-relay [SECONDS], 0.01 to 3600" << std::endl;
        return EXIT_FAILURE;
    }
    nvDrvSetInterface(0, 0);
    const Figures local = measure(std::make_unique<KSLocalMsgQueue>(NvCompDesc{}, 512, 50), seconds);
    const BackgroundRelay relay;
    const Figures remote =
        measure(std::make_unique<KSRemoteMsgQueue>(NvCompDesc{}, 512, 50, relay.host().c_str()), seconds);
    std::cout << "          events/s   median answer   99% of answers (microseconds)\n";
    print("local", local);
    print("relay", remote);
    std::cout << std::setprecision(1) << "added by the relay: " << remote.median - local.median
              << " microseconds an answer; " << 100 * remote.eventsPerSecond / local.eventsPerSecond
              << " % of the events\n";
    return EXIT_SUCCESS;
}
