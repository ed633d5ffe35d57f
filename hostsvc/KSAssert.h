// Fatal inconsistencies.
#ifndef HOSTSVC_KSASSERT_H
#define HOSTSVC_KSASSERT_H

// Ends the process as a failed assertion does, in every build; the place is given, not where the call stands.
[[noreturn]] void ks_assertionFailed(const char* expression, const char* source, unsigned line,
                                     const char* function);

#endif
