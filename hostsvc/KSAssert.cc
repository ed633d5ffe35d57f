#include "hostsvc/KSAssert.h"

#undef NDEBUG  // or the header hides the function
#include <cassert>

void ks_assertionFailed(const char* expression, const char* source, unsigned line, const char* function) {
    __assert_fail(expression, source, line, function);
}
