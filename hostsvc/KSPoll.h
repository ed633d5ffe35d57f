// Trying again and again for a bounded time.
#ifndef HOSTSVC_KSPOLL_H
#define HOSTSVC_KSPOLL_H

#include <cerrno>

#include "hostsvc/KSSleep.h"

// timeoutMs / intervalMs rounds of one try and one pause of intervalMs, then a last try. intervalMs must not
// be 0; if it is, there is the last try alone. `pause` takes the time as a timeval. What is tried for may
// come meanwhile: then it takes it and returns 0 at once; otherwise it returns an error number.
template <typename Try, typename Pause>
bool ks_poll(unsigned timeoutMs, unsigned intervalMs, Try once, Pause pause) {
    const unsigned rounds = intervalMs == 0 ? 0 : timeoutMs / intervalMs;
    for (unsigned round = 0; round < rounds; ++round) {
        if (once())
            return true;
        const int result = pause(ks_timeout_ms(intervalMs));
        if (result == 0)
            return true;
        if (result == EINTR)
            ks_reportInterruptedSleep();
    }
    return once();
}

#endif
