// Composes the sentences at the beginning of a report.
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

// The facts for the sentences. All references must outlive this object.
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

// Sentences about the trace, its links, its calls and its findings. Control characters are made harmless. The
// sentences are plain text, not markup.
std::vector<std::string> summaryOf(const Overview& overview);

}  // namespace reader

#endif
