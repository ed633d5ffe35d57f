// Sleeping.
#ifndef HOSTSVC_KSSLEEP_H
#define HOSTSVC_KSSLEEP_H

#include <sys/time.h>

void ks_sleep(unsigned seconds);

// The time is computed in 32-bit microseconds, so 4294968 ms and more wrap around to a short sleep.
void ks_sleep_ms(unsigned milliseconds);

// A signal ends the sleep early, which is reported on the standard error stream.
void ks_sleep_us(unsigned microseconds);

// For waits that last as long as such a sleep: the time in the form of the system's calls (with the same
// wrap), and the report of a signal.
timeval ks_timeoutMs(unsigned milliseconds);
void ks_reportInterruptedSleep();

#endif
