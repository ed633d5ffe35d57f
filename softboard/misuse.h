// Ends a process that misuses the transport library.
#ifndef SOFTBOARD_MISUSE_H
#define SOFTBOARD_MISUSE_H

#include <string>

namespace softboard {

// Writes "softboard: FUNCTION: WHAT" to the standard error stream and aborts the process. `function` is the
// transport function that was called.
[[noreturn]] void misuse(const char* function, const std::string& what);

}  // namespace softboard

#endif
