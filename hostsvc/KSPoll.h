// Trying again and again for a bounded time.
#ifndef HOSTSVC_KSPOLL_H
#define HOSTSVC_KSPOLL_H

#include "hostsvc/KSSleep.h"

// timeoutMs / intervalMs rounds of one try and one sleep of intervalMs, then a last try. intervalMs must not
// be 0; if it is, there is the last try alone.
template <typename Try>
bool ks_poll(unsigned timeoutMs, unsigned intervalMs, Try once) {
    const unsigned rounds = intervalMs == 0 ? 0 : timeoutMs / intervalMs;
    for (unsigned round = 0; round < rounds; ++round) {
        if (once())
            return true;
        ks_sleep_ms(intervalMs);
    }
    return once();
}

#endif
