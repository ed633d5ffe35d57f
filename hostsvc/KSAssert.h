// Ends the process when the program contradicts itself.
#ifndef HOSTSVC_KSASSERT_H
#define HOSTSVC_KSASSERT_H

// Ends the process as a failed assertion does, in every build. The report names the place that the caller
// gives.
[[noreturn]] void ks_assertionFailed(const char* expression, const char* source, unsigned line,
                                     const char* function);

#endif
