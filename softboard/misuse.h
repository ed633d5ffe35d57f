// What a program must not do with the transport: said on the standard error stream, then the process aborts.
#ifndef SOFTBOARD_MISUSE_H
#define SOFTBOARD_MISUSE_H

#include <string>

namespace softboard {

// `function` is the transport call that was misused.
[[noreturn]] void misuse(const char* function, const std::string& what);

}  // namespace softboard

#endif
