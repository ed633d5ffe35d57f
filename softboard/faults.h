// Faults: what the boards and the library can be told to do wrong. docs/user/softboard.md describes each.
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
    uint32_t argument = 0;  // the N of NAME=N; 0 for a fault that takes no number

    bool operator==(const Fault&) const = default;
};

struct FaultName {
    FaultKind kind;
    const char* name;
    bool takesNumber;
    uint32_t otherwise;  // the number if none is given
    uint32_t least;      // the numbers that are allowed: least to most
    uint32_t most;
    const char* help;
};

// The table of all faults.
std::span<const FaultName> faultNames();

// Reads "NAME" or "NAME=NUMBER". Throws std::invalid_argument with a sentence that says what is wrong.
Fault parseFault(const std::string& text);
// The text that parseFault reads.
std::string toText(const Fault& fault);

}  // namespace softboard

#endif
