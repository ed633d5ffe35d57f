#include "bench/road/reading.h"

#include <chrono>
#include <ctime>
#include <memory>

#include "bench/host.h"
#include "hostsvc/KSAbandonedThread.h"
#include "hostsvc/KSLocalMsgQueue.h"

namespace bench {

namespace {

double cpuMicroseconds() {
    std::timespec used{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &used);
    return static_cast<double>(used.tv_sec) * 1e6 + static_cast<double>(used.tv_nsec) / 1e3;
}

void* doNothing(void*, void*) { return nullptr; }

}  // namespace

double readEvents(double seconds, bool threadForEach) {
    using Clock = std::chrono::steady_clock;
    nvDrvSetInterface(0, 0);
    Host host(std::make_unique<KSLocalMsgQueue>(NvCompDesc{}, 512, 50));
    host.startTrace();
    const auto end = Clock::now() + std::chrono::duration<double>(seconds);
    const double before = cpuMicroseconds();
    unsigned long events = 0;
    for (; Clock::now() < end; ++events) {
        host.hearEvent();
        if (threadForEach)
            KSAbandonedThread_create(doNothing, nullptr, 0);
    }
    const double used = cpuMicroseconds() - before;
    host.endTrace();
    return used / static_cast<double>(events);
}

}  // namespace bench
