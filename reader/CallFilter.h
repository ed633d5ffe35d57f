// The filters that ask for whole calls: --call, --failed, --unanswered.
#ifndef READER_CALLFILTER_H
#define READER_CALLFILTER_H

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "calls/Call.h"
#include "reader/FilterGroups.h"

namespace reader {

// One condition on a call.
class CallCondition {
  public:
    virtual ~CallCondition() = default;
    // Whether a call that has gone meets the condition.
    virtual bool holds(const calls::Call& call) const = 0;
    // Whether a call that is alive meets the condition, as far as its number tells; empty if only its end can
    // tell.
    virtual std::optional<bool> holdsFor(std::uint64_t /*number*/) const { return std::nullopt; }
};

// Make the conditions for the rows of filters. They throw UsageError for a value that means nothing.
std::unique_ptr<CallCondition> byCallNumber(const std::string& value);
std::unique_ptr<CallCondition> byFailure(const std::string& value);
std::unique_ptr<CallCondition> byNoAnswer(const std::string& value);

class CallFilter {
  public:
    // Uses the filters that are about calls and ignores the others. Throws UsageError.
    explicit CallFilter(std::span<const FilterWord> words);

    // Whether there is no condition, so that everything is wanted.
    bool isEmpty() const { return groups_.empty(); }
    // Whether frames and findings that belong to no call are wanted.
    bool wantsRest() const;
    // Whether a call that is alive is wanted; empty while its end may still change the answer.
    std::optional<bool> wants(std::uint64_t number) const;
    // Whether a call that has gone is wanted.
    bool wants(const calls::Call& call) const;

  private:
    std::vector<FilterGroup<CallCondition>> groups_;
};

}  // namespace reader

#endif
