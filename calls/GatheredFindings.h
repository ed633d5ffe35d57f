// Reports several findings that have one cause as one finding: thirty RESTARTs that nobody acknowledged, for
// example.
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

// Keeps the findings that it gets, which are of one kind and about one side, until its owner calls
// complete(). Then it reports the first of them, with the channels of all and their number. If that happens
// again within ten minutes, it is only counted (RepeatedFindings). Memory is bounded: only the channels of
// further findings are kept.
class GatheredFindings : public FindingSink {
  public:
    // Composes the sentence for several findings. `channels` is the text for their channels: "channels 1, 2";
    // empty if they name none.
    using Sentence = std::function<std::string(const Finding& first, const std::string& channels)>;

    GatheredFindings(FindingSink& sink, Sentence sentence)
        : repeated_(sink), sentence_(std::move(sentence)) {}

    void report(Finding finding) override;
    // The clock has come to `at`.
    void advance(std::int64_t at) { now_ = at; }
    // When the first of the findings that are kept came; empty if none is kept.
    std::optional<std::int64_t> since() const { return first_ ? std::optional(since_) : std::nullopt; }
    // No further finding of this cause will come. Reports the findings that are kept as one.
    void complete();
    // Reports what was only counted, once ten minutes have passed. Call this behind what is completed.
    void reportCounted() { repeated_.advance(now_); }
    // The trace has ended. Reports what is kept and what was only counted.
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
