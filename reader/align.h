// Two series side by side.
#ifndef READER_ALIGN_H
#define READER_ALIGN_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <vector>

namespace reader {

// A member of a series: only members of one kind can stand beside each other, and preferably equal ones do.
struct Token {
    std::uint32_t kind;
    std::uint32_t content;  // equal for equal members
};

struct AlignedPair {
    std::size_t a;
    std::size_t b;
    bool operator==(const AlignedPair&) const = default;
};

// The pairs, in order, such that their number is the largest, and of all such choices one with most equal
// pairs (the longest common subsequence, weighted). Memory grows with the length of the series, time with the
// product of what is left between their common beginning and end; nothing if that is beyond 400 million.
std::optional<std::vector<AlignedPair>> align(std::span<const Token> a, std::span<const Token> b);

}  // namespace reader

#endif
