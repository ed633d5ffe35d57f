// Finds D channels whose two ends play the same role, and lines that are looped.
#ifndef CALLS_ROLES_H
#define CALLS_ROLES_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "calls/Link.h"
#include "calls/LinkWatch.h"
#include "calls/Stream.h"

namespace calls {

// Two ends of the same role and a looped line look alike at first, because the frames of both directions
// carry the same C/R. But over a loop, each frame that comes in is octet for octet the same as one that went
// out less than 200 ms before.
class Roles {
  public:
    // Takes a frame. `sameRole`: the frame has shown that both sides code commands alike. Returns what it has
    // found, each fault only once.
    std::optional<Observation> take(const Sample& sample, bool sameRole);
    // At the end of the trace.
    std::optional<Observation> finish();

    // Whether one of the two faults is found or suspected. Other faults of the links then follow from it and
    // need not be reported.
    bool broken() const { return looped_ || suspected_.has_value() || reported_; }

  private:
    struct Sent {
        std::size_t hash = 0;
        std::int64_t at = 0;
        bool there = false;
    };

    bool wasSent(const Sample& sample) const;
    std::optional<Observation> report(const FindingKind& kind, std::uint64_t frame, std::int64_t at,
                                      std::string sentence);

    std::array<Sent, 16> sent_{};  // the last frames that went out, used as a ring
    std::size_t next_ = 0;
    unsigned copies_ = 0;  // how many frames in a row came in as they had gone out
    bool looped_ = false;
    bool reported_ = false;
    struct Suspicion {
        std::uint64_t frame;
        std::int64_t at;
    };
    std::optional<Suspicion> suspected_;
};

}  // namespace calls

#endif
