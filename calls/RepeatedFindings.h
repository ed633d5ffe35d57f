// Passes findings on, each kind of a link once in ten minutes.
#ifndef CALLS_REPEATEDFINDINGS_H
#define CALLS_REPEATEDFINDINGS_H

#include <cstdint>
#include <map>
#include <optional>
#include <tuple>

#include "calls/Finding.h"
#include "calls/FindingSink.h"
#include "calls/Message.h"

namespace calls {

// The first finding of a kind goes to the sink at once. Those that come within ten minutes are counted, and
// the last of them goes with their count: with the next one after that time, or at the end.
class RepeatedFindings {
  public:
    explicit RepeatedFindings(FindingSink& sink) : sink_(&sink) {}

    // `at` is the finding's moment on the D channel's clock.
    void report(Finding finding, std::uint8_t tei, std::int64_t at);
    void finish();

  private:
    using Key = std::tuple<const FindingKind*, Severity, std::uint8_t>;  // with the TEI
    struct Repeats {
        std::int64_t reported = 0;
        std::optional<Finding> last{};  // its count says how many it stands for
    };

    FindingSink* sink_;
    std::map<Key, Repeats> repeats_;
};

}  // namespace calls

#endif
