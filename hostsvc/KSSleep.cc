#include "hostsvc/KSSleep.h"

#include <iostream>

#include "hostsvc/KSSystem.h"

void ks_sleep(unsigned seconds) { ks_system().sleep(seconds); }

void ks_sleep_ms(unsigned milliseconds) { ks_sleep_us(milliseconds * 1000U); }

void ks_sleep_us(unsigned microseconds) {
    constexpr unsigned second = 1000000;
    const timeval timeout{static_cast<time_t>(microseconds / second),
                          static_cast<suseconds_t>(microseconds % second)};
    if (ks_system().waitFor(timeout) == -1)
        std::cerr << "*** sleep_us interupted by signal ***" << std::endl;
}
