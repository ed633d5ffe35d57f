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
    // Of a call that has gone.
    virtual bool holds(const calls::Call& call) const = 0;
    // What the number alone tells, of a call that is alive; empty if only its end can tell.
    virtual std::optional<bool> holdsFor(std::uint64_t /*number*/) const { return std::nullopt; }
};

// For the rows of filters. They throw UsageError for a value that means nothing.
std::unique_ptr<CallCondition> byCallNumber(const std::string& value);
std::unique_ptr<CallCondition> byFailure(const std::string& value);
std::unique_ptr<CallCondition> byNoAnswer(const std::string& value);

class CallFilter {
  public:
    // Takes the words that are about calls, and leaves the others alone. Throws UsageError.
    explicit CallFilter(std::span<const FilterWord> words);

    // Nothing is asked: all is wanted.
    bool isEmpty() const { return groups_.empty(); }
    // Whether what belongs to no call is wanted.
    bool wantsRest() const;
    // Of a call that is alive: empty while its end may still change the answer.
    std::optional<bool> wants(std::uint64_t number) const;
    // Of a call that has gone.
    bool wants(const calls::Call& call) const;

  private:
    std::vector<FilterGroup<CallCondition>> groups_;
};

}  // namespace reader

#endif
