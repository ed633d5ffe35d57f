#include "calls/RepeatedFindings.h"

#include <utility>

namespace calls {

namespace {

constexpr std::int64_t quiet = 600 * second;

}  // namespace

void RepeatedFindings::report(Finding finding, std::uint8_t tei, std::int64_t at) {
    const auto [place, isFirst] = repeats_.try_emplace(Key(finding.kind, finding.severity, tei), Repeats{at});
    Repeats& repeats = place->second;
    finding.count += repeats.last ? repeats.last->count : 0;
    if (!isFirst && at - repeats.reported < quiet) {
        repeats.last = std::move(finding);
        return;
    }
    repeats.last.reset();
    repeats.reported = at;
    sink_->report(std::move(finding));
}

void RepeatedFindings::finish() {
    for (auto& [key, repeats] : repeats_)
        if (repeats.last)
            sink_->report(std::move(*repeats.last));
    repeats_.clear();
}

}  // namespace calls
