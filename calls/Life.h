// A call, and what the table and its progress need to know besides. Internal to calls/.
#ifndef CALLS_LIFE_H
#define CALLS_LIFE_H

#include <bitset>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "calls/CallTable.h"

namespace calls {

struct Life {
    Call call;
    CallKey key;
    std::vector<std::uint8_t> setup;  // the octets of SETUP's message, to know its repetitions by
    std::int64_t lastSetup = 0;       // when it was sent last
    bool answered = false;            // any message from the other side
    bool proceeding = false;          // CALL PROCEEDING or later: no more digits come
    bool numberTyped = false;         // the called number has its type and plan
    bool ended = false;
    bool heardSinceLoss = false;   // some message of it came since frames were lost last
    std::uint64_t generation = 0;  // the generation of its deadlines that count; older deadlines are ignored
    std::optional<Side> releasedBy;    // who sent RELEASE first
    std::optional<Side> clearedFirst;  // who sent the first clearing message
    std::uint8_t clearingNs = 0;       // its N(S), if it was an I frame
    bool clearingNumbered = false;
    std::string clearingChannel;          // the name of its D channel
    std::uint64_t clearingNumbering = 0;  // as in Message
    bool crossingDecided = false;         // whether the other side cleared on its own
    std::optional<std::int64_t> connectAt;
    bool answeredByUser = false;         // CONNECT, or a later message that shows the same
    std::vector<std::uint8_t> identity;  // of SUSPEND or RESUME
    // For a broadcast SETUP, by TEI: the terminals that answered, and those that have left the call.
    std::bitset<128> joined;
    std::bitset<128> left;
    std::optional<Side> turnedAwayBy;    // who began the clearing between the network and a single terminal
    std::optional<CauseGiven> refusal;   // of the causes that terminals gave, the one that says most
    std::optional<std::uint8_t> winner;  // the one that got CONNECT ACKNOWLEDGE
};

// Takes over what a message says about the call: numbers, bearer, channel, times, causes. It does not decide
// whether the call begins or ends with the message.
void learn(Life& life, const Message& message);

// Fills in what is known only at the end: outcome, duration, who cleared.
void conclude(Life& life, EndedBy by, const Moment& end);

}  // namespace calls

#endif
