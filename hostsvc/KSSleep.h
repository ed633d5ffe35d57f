// Sleeping.
#ifndef HOSTSVC_KSSLEEP_H
#define HOSTSVC_KSSLEEP_H

#include <sys/time.h>

void ks_sleep(unsigned seconds);

// Wraps at 4294968 ms and above: the time is reckoned in microseconds of 32 bits.
void ks_sleep_ms(unsigned milliseconds);

// A signal ends it early, and says so on the standard error stream.
void ks_sleep_us(unsigned microseconds);

// For those who wait for as long as a sleep would take: the time as the system's calls want it, and the line
// about a signal.
timeval ks_timeout_ms(unsigned milliseconds);
void ks_reportInterruptedSleep();

#endif
