// What healthy trunks do that looks like a fault, told frame by frame.
#ifndef TESTS_CALLS_TRAPS_H
#define TESTS_CALLS_TRAPS_H

#include <span>
#include <string_view>

#include "calls/Finding.h"
#include "tests/calls/CallScript.h"

namespace calls::test {

struct Trap {
    std::string_view name;  // of its file in tests/reader/data/traps, and what is in it
    std::string_view says;
    capture::Role role;  // of our side
    // The frames; those of a trunk that is at fault in the same place if `spoilt`.
    void (*tell)(CallScript& script, bool spoilt);
    // Must be found in the spoilt one; null where no fault resembles the trap.
    const FindingKind* spoiltShows;
};
std::span<const Trap> traps();

}  // namespace calls::test

#endif
