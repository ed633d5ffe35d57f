#include "reader/CallFilter.h"

namespace reader {

namespace {

class OnNumber : public CallCondition {
  public:
    explicit OnNumber(std::uint64_t number) : number_(number) {}
    bool holds(const calls::Call& call) const override { return call.number == number_; }
    std::optional<bool> holdsFor(std::uint64_t number) const override { return number == number_; }

  private:
    std::uint64_t number_;
};

class AtItsEnd : public CallCondition {
  public:
    explicit AtItsEnd(bool (*predicate)(const calls::Call& call)) : predicate_(predicate) {}
    bool holds(const calls::Call& call) const override { return predicate_(call); }

  private:
    bool (*predicate_)(const calls::Call& call);
};

}  // namespace

std::unique_ptr<CallCondition> byCallNumber(const std::string& value) {
    std::uint64_t number = 0;
    if (!readNumber(std::string_view(value), number) || number == 0)
        throw UsageError("--call takes the number of a call, as `lapdread calls` prints it, not " + value);
    return std::make_unique<OnNumber>(number);
}

std::unique_ptr<CallCondition> byFailure(const std::string& /*value*/) {
    return std::make_unique<AtItsEnd>(calls::hasFailed);
}

std::unique_ptr<CallCondition> byNoAnswer(const std::string& /*value*/) {
    return std::make_unique<AtItsEnd>(calls::isUnanswered);
}

CallFilter::CallFilter(std::span<const FilterWord> words)
    : groups_(groupsOf(words, &FilterRow::makeOnCalls)) {}

bool CallFilter::wantsRest() const {
    return std::ranges::all_of(groups_, [](const auto& group) { return group.negated; });
}

// If one group refuses the call, it is not wanted. Otherwise the answer is open as long as one group cannot
// tell yet.
std::optional<bool> CallFilter::wants(std::uint64_t number) const {
    bool isOpen = false;
    for (const auto& group : groups_) {
        bool any = false;
        bool unknown = false;
        for (const auto& condition : group.anyOf) {
            const std::optional<bool> holds = condition->holdsFor(number);
            any = any || holds.value_or(false);
            unknown = unknown || !holds;
        }
        if (!any && unknown)
            isOpen = true;
        else if (any == group.negated)
            return false;
    }
    return isOpen ? std::nullopt : std::optional(true);
}

bool CallFilter::wants(const calls::Call& call) const {
    return std::ranges::all_of(groups_, [&](const auto& group) {
        return std::ranges::any_of(group.anyOf, [&](const auto& condition) {
                   return condition->holds(call);
               }) != group.negated;
    });
}

}  // namespace reader
