// Findings in the management of TEIs: TEIs that were denied, removed, doubled or assigned (Q.921 5.3).
#ifndef CALLS_TEIWATCH_H
#define CALLS_TEIWATCH_H

#include <array>
#include <cstdint>
#include <optional>
#include <vector>

#include "calls/LinkWatch.h"
#include "calls/Stream.h"

namespace calls {

class TeiWatch {
  public:
    // Takes a UI frame of management and appends what it shows. `longest` (T201) is how long after a check
    // its answers may come.
    void take(const Sample& sample, std::int64_t longest, std::vector<Observation>& found);
    // Tells the watch that the D channel is one of a primary rate, where TEIs need not be assigned. Returns
    // the observation of the first TEI that was assigned, if there is one.
    std::optional<Observation> isPrimary();

  private:
    struct Answer {  // to a check
        std::int64_t at = 0;
        std::uint16_t reference = 0;
        bool there = false;
    };

    void answers(const Sample& sample, const isdn::TeiMessage& message, std::int64_t longest,
                 std::vector<Observation>& found);

    std::array<Answer, 128> answers_{};  // by TEI
    std::optional<Observation> assigned_;
    bool assignedReported_ = false;
};

}  // namespace calls

#endif
