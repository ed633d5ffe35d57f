// The calls that pass a filter, sorted.
#ifndef READER_BROWSE_CALLLIST_H
#define READER_BROWSE_CALLLIST_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "reader/CallOrder.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

// Looks at the calls a few at a time, in work(), so that keys are answered while a long list fills.
class CallList {
  public:
    explicit CallList(Desk& desk) : desk_(desk) {}

    // Sets the filter: words that a call's line must hold, in capitals or small letters. A word after "!"
    // must not be in the line. Four words ask about the call itself: "failed", "unanswered", "open",
    // "marked".
    void setFilter(const std::string& words);
    const std::string& filter() const { return filter_; }
    // An index into callOrders().
    void setOrder(std::size_t order);
    std::size_t order() const { return order_; }

    void changed(const Changes& changes);
    // Looks at calls that were not looked at yet, at most until this time. Returns true if there are more.
    bool work(Screen::Clock::time_point until);

    std::size_t size() const { return shown_.size(); }
    std::uint64_t operator[](std::size_t i) const { return shown_[i].number; }
    std::optional<std::size_t> find(std::uint64_t call) const;

  private:
    struct Entry {
        std::int64_t key;
        std::uint64_t number;
        auto operator<=>(const Entry&) const = default;
    };
    struct Word {
        std::string text;  // in small letters
        bool negated = false;
        bool (*asks)(const calls::Call& call, const Marked& marked) = nullptr;  // null: the line is searched
    };

    void beginAgain();
    bool passes(const calls::Call& call);
    void remove(std::uint64_t call);
    std::int64_t keyOf(const calls::Call& call) const { return callOrders()[order_].value(call); }

    Desk& desk_;
    std::string filter_;
    std::vector<Word> words_;
    std::size_t order_ = 0;
    std::vector<Entry> shown_;
    std::unordered_map<std::uint64_t, std::int64_t> keys_;  // of the shown calls, as they stand in shown_
    std::uint64_t lookedAt_ = 0;                            // calls up to this number were looked at
    std::string line_;
};

}  // namespace reader::browse

#endif
