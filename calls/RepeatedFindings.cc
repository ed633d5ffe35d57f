#include "calls/RepeatedFindings.h"

#include <algorithm>
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
        due_ = std::min(due_, repeats.reported + quiet);
        return;
    }
    repeats.last.reset();
    repeats.reported = at;
    sink_->report(std::move(finding));
}

void RepeatedFindings::advance(std::int64_t at) {
    if (at < due_)
        return;
    due_ = never;
    for (auto& [key, repeats] : repeats_) {
        if (!repeats.last)
            continue;
        if (at - repeats.reported >= quiet) {
            sink_->report(*std::exchange(repeats.last, std::nullopt));
            repeats.reported = at;
        } else {
            due_ = std::min(due_, repeats.reported + quiet);
        }
    }
}

void RepeatedFindings::finish() {
    for (auto& [key, repeats] : repeats_)
        if (repeats.last)
            sink_->report(std::move(*repeats.last));
    repeats_.clear();
}

}  // namespace calls
