// Tries something again and again for a limited time.
#ifndef HOSTSVC_KSPOLL_H
#define HOSTSVC_KSPOLL_H

#include <cerrno>

#include "hostsvc/KSSleep.h"

// Makes timeoutMs / intervalMs rounds of one try and one pause of intervalMs, then a last try. If intervalMs
// is 0, makes only the last try. `pause` gets the time as a timeval. If what is tried for becomes available
// during the pause, `pause` takes it and returns 0 at once; otherwise it returns an error number.
template <typename Try, typename Pause>
bool ks_poll(unsigned timeoutMs, unsigned intervalMs, Try once, Pause pause) {
    const unsigned rounds = intervalMs == 0 ? 0 : timeoutMs / intervalMs;
    for (unsigned round = 0; round < rounds; ++round) {
        if (once())
            return true;
        const int result = pause(ks_timeoutMs(intervalMs));
        if (result == 0)
            return true;
        if (result == EINTR)
            ks_reportInterruptedSleep();
    }
    return once();
}

#endif
