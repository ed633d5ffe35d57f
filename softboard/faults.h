// What the board and its library can be told to do wrong: each fault has a name and, most of them, a number.
#ifndef SOFTBOARD_FAULTS_H
#define SOFTBOARD_FAULTS_H

#include <cstdint>
#include <span>
#include <string>

namespace softboard {

enum class FaultKind {
    allocateFails,
    openFails,
    bindFails,
    replyLost,
    replyLate,
    replyTwice,
    replyType0,
    replyGeneral,
    replyError,
    replyOtherSource,
    replyWrongTransaction,
    eventTruncated,
    eventOverlong,
    eventLength,
    eventLabel,
    eventType,
    eventSource,
    burst,
    neverWaits,
    eventsWhileStopping,
    silent,
    offsetStays0,
};

struct Fault {
    FaultKind kind{};
    uint32_t argument = 0;

    bool operator==(const Fault&) const = default;
};

struct FaultName {
    FaultKind kind;
    const char* name;
    bool takesNumber;
    uint32_t otherwise;  // the number that is meant when none is given
    uint32_t least;
    uint32_t most;
    const char* help;
};

// All of them, a row each.
std::span<const FaultName> faultNames();

// "NAME" or "NAME=NUMBER"; throws std::invalid_argument with a sentence that says what is wrong.
Fault parseFault(const std::string& text);
std::string toText(const Fault& fault);

}  // namespace softboard

#endif
