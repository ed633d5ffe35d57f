// Limits repeated findings: of each kind, one in ten minutes for each link.
#ifndef CALLS_REPEATEDFINDINGS_H
#define CALLS_REPEATEDFINDINGS_H

#include <cstdint>
#include <limits>
#include <map>
#include <optional>
#include <tuple>

#include "calls/Finding.h"
#include "calls/FindingSink.h"
#include "calls/Message.h"

namespace calls {

// Reports the first finding of a kind to the sink at once. Counts the findings that come in the next ten
// minutes; the next one after that time is reported with their number, or the last of them when that time is
// over or the trace ends.
class RepeatedFindings {
  public:
    explicit RepeatedFindings(FindingSink& sink) : sink_(&sink) {}

    // `at` is the finding's moment on the D channel's clock.
    void report(Finding finding, std::uint8_t tei, std::int64_t at);
    // The D channel's clock has come to `at`. Reports what was only counted for ten minutes. Call this behind
    // the findings of that moment.
    void advance(std::int64_t at);
    void finish();

  private:
    using Key = std::tuple<const FindingKind*, Severity, std::uint8_t>;  // with the TEI
    struct Repeats {
        std::int64_t reported = 0;
        std::optional<Finding> last{};  // its count is the number of findings that it stands for
    };

    static constexpr std::int64_t never = std::numeric_limits<std::int64_t>::max();

    FindingSink* sink_;
    std::map<Key, Repeats> repeats_;
    std::int64_t due_ = never;  // nothing that was counted is to be reported before
};

}  // namespace calls

#endif
