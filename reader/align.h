// Aligns two series of messages.
#ifndef READER_ALIGN_H
#define READER_ALIGN_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <vector>

namespace reader {

// A member of a series. Only members of the same kind can be paired, and equal ones are preferred.
struct Token {
    std::uint32_t kind;
    std::uint32_t content;  // equal for equal members
};

struct AlignedPair {
    std::size_t a;
    std::size_t b;
    bool operator==(const AlignedPair&) const = default;
};

// Returns the pairs in order. Their number is the largest possible, and among all such choices the number of
// equal pairs is the largest (a weighted longest common subsequence). Memory grows with the length of the
// series. Time grows with the product of the lengths between their common beginning and end; returns nothing
// if that product is above 400 million.
std::optional<std::vector<AlignedPair>> align(std::span<const Token> a, std::span<const Token> b);

}  // namespace reader

#endif
