// What is wrong, or worth knowing, on a D channel: the kinds of findings, and one finding.
#ifndef CALLS_FINDING_H
#define CALLS_FINDING_H

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "capture/Frame.h"

namespace calls {

// note: legal, but worth knowing. warning: a rule is broken, or a repetition was needed. error: a link or a
// call is lost, or a rule is broken with effect.
enum class Severity : std::uint8_t { note, warning, error };
// "note", "warning", "error".
std::string_view nameOf(Severity severity);

// One row of the table of findings. `id` is what programs search for and never changes.
struct FindingKind {
    std::string_view id;
    Severity severity;
    std::string_view clause;  // of the standard that the finding is about
    std::string_view meaning;
    std::string_view lookAt;  // what to look at next
};

// All kinds, in the order of the documentation.
std::span<const FindingKind* const> findingKinds();
const FindingKind* findingKind(std::string_view id);

// A finding belongs to a frame: the frame that shows it, or the last frame before a timer ran out.
struct Finding {
    const FindingKind* kind = nullptr;
    Severity severity = Severity::note;  // the severity of its kind, or a milder one
    std::uint64_t frame = 0;             // the frame's number in the input, from 1
    capture::Clock clock = capture::Clock::none;
    std::int64_t time = 0;    // nanoseconds, as `clock` says
    std::string_view clause;  // that of its kind, unless the case falls under another one
    std::string dChannel;
    std::optional<std::uint64_t> call;  // the call's number, if the finding is about a call
    std::string sentence;               // what happened, with the values of this case; no full stop
    std::uint32_t count = 1;            // how many occurrences this finding stands for
    std::vector<std::string> channels;  // the B channels that it names, if any: "7", "2/7"
};

}  // namespace calls

#endif
