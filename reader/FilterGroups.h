// Combines filters: the values of one filter are alternatives, and all filters must agree.
#ifndef READER_FILTER_GROUPS_H
#define READER_FILTER_GROUPS_H

#include <algorithm>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "reader/Filter.h"
#include "reader/errors.h"
#include "reader/text.h"

namespace reader {

template <class Kind>
struct FilterGroup {
    std::string name;
    bool negated = false;
    std::vector<std::unique_ptr<Kind>> anyOf;
};

// Groups the filters whose row has a function in the member `make`, and makes their conditions with it.
// Ignores the other words. Throws UsageError.
template <class Kind>
std::vector<FilterGroup<Kind>> groupsOf(std::span<const FilterWord> words,
                                        std::unique_ptr<Kind> (*FilterRow::*make)(const std::string&)) {
    std::vector<FilterGroup<Kind>> groups;
    for (const FilterWord& word : words) {
        const FilterRow& row = filterRowNamed(word.name);
        if (row.*make == nullptr)
            continue;
        auto group = std::find_if(groups.begin(), groups.end(), [&](const FilterGroup<Kind>& known) {
            return known.name == word.name && known.negated == word.negated;
        });
        if (group == groups.end())
            group = groups.insert(groups.end(), FilterGroup<Kind>{word.name, word.negated, {}});
        if (row.form.empty()) {
            group->anyOf.push_back((row.*make)(""));
            continue;
        }
        const std::vector<std::string> values = splitAtCommas(word.value);
        if (values.empty())
            throw UsageError("--" + word.name + " needs a value");
        for (const std::string& value : values)
            group->anyOf.push_back((row.*make)(value));
    }
    return groups;
}

}  // namespace reader

#endif
