#include "hostsvc/KSSleep.h"

#include <iostream>

#include "hostsvc/KSSystem.h"

namespace {

timeval timeoutOf(unsigned microseconds) {
    constexpr unsigned second = 1000000;
    return {static_cast<time_t>(microseconds / second), static_cast<suseconds_t>(microseconds % second)};
}

unsigned microsecondsOf(unsigned milliseconds) { return milliseconds * 1000U; }

}  // namespace

void ks_sleep(unsigned seconds) { ks_system().sleep(seconds); }

void ks_sleep_ms(unsigned milliseconds) { ks_sleep_us(microsecondsOf(milliseconds)); }

void ks_sleep_us(unsigned microseconds) {
    if (ks_system().waitFor(timeoutOf(microseconds)) == -1)
        ks_reportInterruptedSleep();
}

timeval ks_timeoutMs(unsigned milliseconds) { return timeoutOf(microsecondsOf(milliseconds)); }

void ks_reportInterruptedSleep() { std::cerr << "*** sleep_us interupted by signal ***" << std::endl; }
