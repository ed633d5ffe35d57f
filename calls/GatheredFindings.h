// Tells as one finding what has one cause: thirty RESTARTs that nobody acknowledged, for example.
#ifndef CALLS_GATHEREDFINDINGS_H
#define CALLS_GATHEREDFINDINGS_H

#include <cstdint>
#include <functional>
#include <optional>
#include <string>

#include "calls/Finding.h"
#include "calls/FindingSink.h"
#include "calls/RepeatedFindings.h"

namespace calls {

// Keeps the findings that it is told, of one kind and about one side, until its owner says that they are
// complete. Then it reports the first of them, with the channels of all and their number. What comes again
// within ten minutes is only counted (RepeatedFindings). Memory is bounded: of further findings only the
// channels are kept.
class GatheredFindings : public FindingSink {
  public:
    // The sentence of several findings. `channels` is what the sentence calls their channels: "channels 1,
    // 2"; empty if they name none.
    using Sentence = std::function<std::string(const Finding& first, const std::string& channels)>;

    GatheredFindings(FindingSink& sink, Sentence sentence)
        : repeated_(sink), sentence_(std::move(sentence)) {}

    void report(Finding finding) override;
    // The clock has come to `at`.
    void advance(std::int64_t at) { now_ = at; }
    // When the first of those that are kept came; empty if there is none.
    std::optional<std::int64_t> since() const { return first_ ? std::optional(since_) : std::nullopt; }
    // Those that are kept are all.
    void complete();
    // The end of the trace.
    void finish();

  private:
    RepeatedFindings repeated_;
    Sentence sentence_;
    std::optional<Finding> first_;  // with the channels and the number of all
    std::int64_t since_ = 0;
    std::int64_t now_ = 0;
};

}  // namespace calls

#endif
