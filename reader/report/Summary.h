// What a report says first, in sentences.
#ifndef READER_REPORT_SUMMARY_H
#define READER_REPORT_SUMMARY_H

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "calls/Figures.h"
#include "calls/Finding.h"
#include "calls/LinkHistory.h"
#include "reader/TimeText.h"

namespace reader {

// What the sentences are made of. All references outlive this.
struct Overview {
    std::uint64_t frames = 0;
    Instant from{};  // of the first frame
    Instant until{};
    bool filtered = false;  // filters choose calls and messages
    const calls::LinkHistory& links;
    const calls::Figures& figures;
    std::array<std::uint64_t, 3> findings{};  // by severity
    std::optional<calls::Finding> worst{};    // the first of the worst ones
};

// The trace, its links, its calls, its findings: a sentence or a few each. Nothing in them commands a
// terminal; they are no markup.
std::vector<std::string> summaryOf(const Overview& overview);

}  // namespace reader

#endif
