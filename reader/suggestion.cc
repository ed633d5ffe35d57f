#include "reader/suggestion.h"

#include <algorithm>
#include <vector>

namespace reader {

namespace {

// How many such mistakes lead from one word to the other (optimal string alignment).
std::size_t distance(std::string_view a, std::string_view b) {
    const std::size_t width = b.size() + 1;
    std::vector<std::size_t> cost((a.size() + 1) * width);
    const auto at = [&](std::size_t i, std::size_t j) -> std::size_t& { return cost[i * width + j]; };
    for (std::size_t i = 0; i <= a.size(); ++i) {
        for (std::size_t j = 0; j <= b.size(); ++j) {
            if (i == 0 || j == 0) {
                at(i, j) = i + j;
                continue;
            }
            const std::size_t change = a[i - 1] == b[j - 1] ? 0 : 1;
            at(i, j) = std::min({at(i - 1, j) + 1, at(i, j - 1) + 1, at(i - 1, j - 1) + change});
            if (i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1])
                at(i, j) = std::min(at(i, j), at(i - 2, j - 2) + 1);
        }
    }
    return cost.back();
}

}  // namespace

std::string_view nearest(std::string_view word, std::span<const std::string_view> names) {
    constexpr std::size_t longWord = 6;
    constexpr std::size_t longestWord = 32;
    if (word.size() > longestWord)
        return {};
    std::string_view found;
    std::size_t least = (word.size() < longWord ? 1 : 2) + 1;
    for (const std::string_view name : names) {
        if (const std::size_t mistakes = distance(word, name); mistakes < least) {
            least = mistakes;
            found = name;
        }
    }
    return found;
}

}  // namespace reader
