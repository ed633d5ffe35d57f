#include "calls/StuckChannels.h"

#include <algorithm>
#include <limits>
#include <utility>

#include "calls/FindingKinds.h"
#include "calls/findingOf.h"

namespace calls {

void StuckChannels::left(const Call& call, const std::vector<ChannelKey>& channels) {
    for (const ChannelKey& key : channels) {
        Finding stuck = findingOf(findings::stuckChannel, call.end, call,
                                  "channel " + toString(key) + " of call " + std::to_string(call.number) +
                                      " was neither cleared nor restarted");
        stuck.channels = {toString(key)};
        orphans_[key] = {call.end.at, call.number, call.endedBy == EndedBy::link, std::move(stuck)};
    }
}

// Reports the channels whose calls went before a moment. Those that went with a link have one cause, and so
// one finding.
void StuckChannels::reportBefore(std::int64_t moment) {
    std::vector<Orphan> lost;
    for (auto orphan = orphans_.begin(); orphan != orphans_.end();) {
        if (orphan->second.at >= moment) {
            ++orphan;
            continue;
        }
        if (orphan->second.withLink)
            lost.push_back(std::move(orphan->second));
        else
            sink_.report(std::move(orphan->second.finding));
        orphan = orphans_.erase(orphan);
    }
    if (!lost.empty())
        reportTogether(lost);
    settleLostLinks();
}

bool StuckChannels::LostLink::has(std::uint64_t call) const {
    return std::binary_search(calls.begin(), calls.end(), call);
}

void StuckChannels::reportTogether(const std::vector<Orphan>& lost) {
    std::vector<std::string> calls;
    Finding all;
    for (const Orphan& orphan : lost) {
        const auto link = std::find_if(lostLinks_.begin(), lostLinks_.end(),
                                       [&](const LostLink& each) { return each.has(orphan.call); });
        if (link != lostLinks_.end()) {
            link->finding.channels.push_back(orphan.finding.channels.front());
            continue;
        }
        if (all.kind == nullptr)
            all = orphan.finding;
        else
            all.channels.push_back(orphan.finding.channels.front());
        calls.push_back(std::to_string(orphan.call));
    }
    if (all.kind == nullptr)
        return;
    if (calls.size() > 1)
        all.sentence = "channels " + listOf(all.channels) + " of calls " + listOf(calls) +
                       " were neither cleared nor restarted after the link was lost";
    sink_.report(std::move(all));
}

void StuckChannels::lostWithLink(Finding massClear, std::vector<std::uint64_t> calls) {
    std::sort(calls.begin(), calls.end());
    lostLinks_.push_back({std::move(massClear), std::move(calls)});
    settleLostLinks();
}

// Reports the failures of which no channel waits any more.
void StuckChannels::settleLostLinks() {
    std::erase_if(lostLinks_, [&](const LostLink& link) {
        if (std::any_of(orphans_.begin(), orphans_.end(), [&](const auto& orphan) {
                return orphan.second.withLink && link.has(orphan.second.call);
            }))
            return false;
        Finding finding = link.finding;
        if (!finding.channels.empty()) {
            finding.severity = finding.kind->severity;  // the link may be well again, and they are not
            finding.sentence += "; neither cleared nor restarted since then: channel" +
                                std::string(finding.channels.size() == 1 ? " " : "s ") +
                                listOf(finding.channels);
        }
        sink_.report(std::move(finding));
        return true;
    });
}

void StuckChannels::forget() {
    orphans_.clear();
    settleLostLinks();
}

void StuckChannels::advance(std::int64_t at) {
    if (!orphans_.empty() || !lostLinks_.empty())
        reportBefore(at - timers_.t316);
}

void StuckChannels::finish() { reportBefore(std::numeric_limits<std::int64_t>::max()); }

}  // namespace calls
