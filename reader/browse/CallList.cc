#include "reader/browse/CallList.h"

#include <algorithm>
#include <sstream>

#include "reader/CallLine.h"

namespace reader::browse {

namespace {

char small(char character) {
    return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a') : character;
}

bool holds(std::string_view line, std::string_view word) {
    return std::search(line.begin(), line.end(), word.begin(), word.end(),
                       [](char a, char b) { return small(a) == b; }) != line.end();
}

constexpr struct {
    std::string_view word;
    bool (*asks)(const calls::Call& call, const Marked& marked);
} questions[] = {
    {"failed", [](const calls::Call& call, const Marked&) { return calls::hasFailed(call); }},
    {"unanswered", [](const calls::Call& call, const Marked&) { return calls::isUnanswered(call); }},
    {"open", [](const calls::Call& call, const Marked&) { return call.endedBy == calls::EndedBy::open; }},
    {"marked",
     [](const calls::Call& call, const Marked& marked) { return marked.calls.contains(call.number); }},
};

}  // namespace

void CallList::setFilter(const std::string& words) {
    filter_ = words;
    words_.clear();
    std::istringstream stream(words);
    for (std::string text; stream >> text;) {
        Word word;
        word.negated = text[0] == '!';
        word.text = text.substr(word.negated ? 1 : 0);
        std::transform(word.text.begin(), word.text.end(), word.text.begin(), small);
        const auto* const question = std::find_if(std::begin(questions), std::end(questions),
                                                  [&](const auto& each) { return each.word == word.text; });
        if (question != std::end(questions))
            word.asks = question->asks;
        if (!word.text.empty())
            words_.push_back(std::move(word));
    }
    beginAgain();
}

void CallList::setOrder(std::size_t order) {
    order_ = order % callOrders().size();
    beginAgain();
}

void CallList::beginAgain() {
    shown_.clear();
    keys_.clear();
    lookedAt_ = 0;
}

bool CallList::passes(const calls::Call& call) {
    line_.clear();
    const auto line = [&]() -> std::string_view {
        if (line_.empty())
            appendCallLine(line_, call, desk_.times());
        return line_;
    };
    return std::all_of(words_.begin(), words_.end(), [&](const Word& word) {
        const bool has = word.asks != nullptr ? word.asks(call, desk_.marked()) : holds(line(), word.text);
        return has != word.negated;
    });
}

void CallList::remove(std::uint64_t call) {
    const auto known = keys_.find(call);
    if (known == keys_.end())
        return;
    shown_.erase(std::lower_bound(shown_.begin(), shown_.end(), Entry{known->second, call}));
    keys_.erase(known);
}

void CallList::changed(const Changes& changes) {
    for (const std::uint64_t call : changes.gone)
        remove(call);
    for (const std::uint64_t number : changes.calls) {
        const calls::Call* const call = desk_.trace().call(number);
        if (number > lookedAt_ || call == nullptr)
            continue;
        remove(number);
        if (!passes(*call))
            continue;
        const Entry entry{keyOf(*call), number};
        shown_.insert(std::lower_bound(shown_.begin(), shown_.end(), entry), entry);
        keys_[number] = entry.key;
    }
}

bool CallList::work(Screen::Clock::time_point until) {
    constexpr int between = 64;  // calls between two looks at the clock
    const auto& all = desk_.trace().calls();
    const auto old = static_cast<std::ptrdiff_t>(shown_.size());
    auto next = all.upper_bound(lookedAt_);
    for (int count = 1; next != all.end(); ++next, ++count) {
        lookedAt_ = next->first;
        if (passes(next->second)) {
            shown_.push_back({keyOf(next->second), next->first});
            keys_[next->first] = shown_.back().key;
        }
        if (count % between == 0 && Screen::Clock::now() >= until)
            break;
    }
    std::sort(shown_.begin() + old, shown_.end());
    std::inplace_merge(shown_.begin(), shown_.begin() + old, shown_.end());
    return all.upper_bound(lookedAt_) != all.end();
}

std::optional<std::size_t> CallList::find(std::uint64_t call) const {
    const auto known = keys_.find(call);
    if (known == keys_.end())
        return std::nullopt;
    const auto at = std::lower_bound(shown_.begin(), shown_.end(), Entry{known->second, call});
    return static_cast<std::size_t>(at - shown_.begin());
}

}  // namespace reader::browse
