// Channels that one end may still hold, since their calls went without clearing (Q.931 5.5).
#ifndef CALLS_STUCKCHANNELS_H
#define CALLS_STUCKCHANNELS_H

#include <cstdint>
#include <map>
#include <vector>

#include "calls/Call.h"
#include "calls/FindingSink.h"
#include "calls/Maintenance.h"
#include "calls/Timers.h"

namespace calls {

// A channel is stuck if nobody restarts or takes it within T316, or until the trace ends. Those that went
// with a link have one cause, and so share one finding.
class StuckChannels {
  public:
    StuckChannels(const Timers& timers, FindingSink& sink) : timers_(timers), sink_(sink) {}

    // The call held these channels, and has ended without clearing.
    void left(const Call& call, const std::vector<ChannelKey>& channels);
    // The channel was restarted, or another call has taken it.
    void freed(const ChannelKey& channel) { orphans_.erase(channel); }
    // Calls ended with their link; `massClear` says so. It is reported as soon as it is known which of their
    // channels stay behind, and names these. If it names some, it has the severity of its kind.
    void lostWithLink(Finding massClear, std::vector<std::uint64_t> calls);
    // The board restarted, or messages are missing in the trace: a channel may have been freed unseen.
    void forget();
    // The clock has come to `at`.
    void advance(std::int64_t at);
    // The end of the trace.
    void finish();

  private:
    struct Orphan {
        std::int64_t at = 0;
        std::uint64_t call = 0;
        bool withLink = false;  // the call went with its link, like others perhaps
        Finding finding;
    };
    // A link's failure and the calls that went with it, while some of their channels may be freed.
    struct LostLink {
        Finding finding;
        std::vector<std::uint64_t> calls;  // in order

        bool has(std::uint64_t call) const;
    };

    void reportBefore(std::int64_t moment);
    void reportTogether(const std::vector<Orphan>& lost);
    void settleLostLinks();

    const Timers& timers_;
    FindingSink& sink_;
    std::map<ChannelKey, Orphan> orphans_;
    std::vector<LostLink> lostLinks_;
};

}  // namespace calls

#endif
