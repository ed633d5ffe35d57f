#include "softboard/misuse.h"

#include <cstdlib>
#include <iostream>

namespace softboard {

void misuse(const char* function, const std::string& what) {
    std::cerr << "softboard: " + std::string(function) + ": " + what + '\n' << std::flush;
    std::abort();
}

}  // namespace softboard
