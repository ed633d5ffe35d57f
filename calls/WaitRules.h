// The table of questions. Internal to calls/.
#ifndef CALLS_WAITRULES_H
#define CALLS_WAITRULES_H

#include <bitset>
#include <cstdint>
#include <string_view>

#include "calls/Waits.h"

namespace calls {

// A row for each question. The finding comes one timer after the last repetition.
struct Waits::Rule {
    std::uint8_t ask;
    capture::Role asker;           // which side asks; unknown: either
    std::bitset<128> answers;      // message types of the side that must answer
    bool sameSideAnswers = false;  // the side that sent `ask` has to go on
    // A clearing message of either side ends the wait; the waiting side clears when its timer has run out.
    bool clearingAnswers = true;
    bool waitingSideGivesUp = true;
    bool progressStops = false;     // PROGRESS that announces something stops the timer
    bool digitsRestart = false;     // overlap sending: INFORMATION of the waiting side restarts it
    bool isRepeated = false;        // the asker repeats it once
    std::string_view timer;         // its name, for people
    std::int64_t Timers::*user;     // its value if the user waits
    std::int64_t Timers::*network;  // if the network does
    const FindingKind* finding;
    const FindingKind* repetition = nullptr;
};

}  // namespace calls

#endif
