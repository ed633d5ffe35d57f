// Whether the two ends of a D channel play different roles, or what comes in is what went out.
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

// Two ends of one role and a looped line look alike at first: the frames of both directions carry the same
// C/R. They differ in that over a loop every frame that comes in is, octet for octet, one that went out less
// than 200 ms before.
class Roles {
  public:
    // Takes a frame, and whether it has shown that both sides code commands alike. Returns a finding, once.
    std::optional<Observation> take(const Sample& sample, bool sameRole);
    // At the end of the trace.
    std::optional<Observation> finish();

    // One of the two is, or may be, the case: what else the links show follows from it.
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

    std::array<Sent, 16> sent_{};  // the last frames that went out, one behind the other
    std::size_t next_ = 0;
    unsigned copies_ = 0;  // frames in a row that came in as they went out
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
