// Two ends of a link that keep to the rules, and a recorder beside one of them.
#ifndef TESTS_CALLS_TWOENDS_H
#define TESTS_CALLS_TWOENDS_H

#include <cstdint>
#include <functional>
#include <vector>

#include "calls/Message.h"
#include "tests/calls/Script.h"

namespace calls::testing {

struct Habits {
    unsigned seed = 1;
    unsigned window = 7;
    std::int64_t idle = 10 * second;    // after which a side polls; 0: it never does
    bool bothPoll = true;               // else our side alone
    std::int64_t between = 3 * second;  // I frames of a side, on average
    unsigned lossesPerThousand = 0;     // I frames that the line loses on their way to us
    unsigned missedPerThousand = 0;     // frames that the recorder does not see
    std::int64_t acknowledgesWithin = 100 * millisecond;
};

// Hands over the frames of so long a time, in the order in which a recorder beside our side sees them: what
// the line loses on its way to us, it never sees. Deterministic for a seed.
void runTwoEnds(const Habits& habits, std::int64_t duration,
                const std::function<void(const ScriptFrame&)>& take);

}  // namespace calls::testing

#endif
