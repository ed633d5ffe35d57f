// The filters that all commands share.
#ifndef READER_FILTER_H
#define READER_FILTER_H

#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "reader/Options.h"
#include "reader/Seen.h"

namespace reader {

// One condition on a frame. Asked by several threads at once.
class Condition {
  public:
    virtual ~Condition() = default;
    virtual bool holds(const Seen& seen) const = 0;
    // Tells the condition when the stream began. Called once, before `holds`. Conditions on time need it.
    virtual void begin(Instant /*firstFrame*/) {}
    // Whether the condition is about time. Such conditions also apply to losses and other events.
    virtual bool isAboutTime() const { return false; }
};

class CallCondition;
template <class Kind>
struct FilterGroup;

// A filter as the command line knows it.
struct FilterRow {
    std::string_view name;
    std::string_view form;  // the form of its value; empty if it takes none
    std::string_view help;
    // Throws UsageError for a value that means nothing.
    std::unique_ptr<Condition> (*make)(const std::string& value);
    // Does the same for a filter on whole calls, whose `make` is null.
    std::unique_ptr<CallCondition> (*makeOnCalls)(const std::string& value) = nullptr;
};
std::span<const FilterRow> filterRows();
// The row of this name, which must exist.
const FilterRow& filterRowNamed(std::string_view name);

// Frames pass if they meet at least one of the values of each filter, and none of those behind --not.
class Filter {
  public:
    // Ignores filters on whole calls. Throws UsageError. Dates are in the time zone that is set now.
    explicit Filter(const std::vector<FilterWord>& words);
    ~Filter();
    Filter(Filter&& other) noexcept;
    Filter& operator=(Filter&& other) noexcept;

    // Whether there is no condition, so that every item passes.
    bool isEmpty() const;

    // To be called before the first passes().
    void begin(Instant firstFrame);
    bool passes(const Seen& seen) const;
    // Whether a condition asks for `keepAlive`, which is known only when a poll's answer is there.
    bool hidesKeepAlives() const { return hidesKeepAlives_; }

  private:
    std::vector<FilterGroup<Condition>> groups_;
    bool hidesKeepAlives_ = false;
};

}  // namespace reader

#endif
