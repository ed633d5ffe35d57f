#include "reader/align.h"

#include <algorithm>

namespace reader {

namespace {

constexpr std::uint64_t mostCells = 400'000'000;

// One pair more is worth more than any number of equal pairs.
constexpr std::uint64_t pairWorth = std::uint64_t{1} << 32U;

std::uint64_t worth(const Token& a, const Token& b) {
    if (a.kind != b.kind)
        return 0;
    return pairWorth + (a.content == b.content ? 1 : 0);
}

// Hirschberg's algorithm: finds the best split of B for the first half of A with two rows of the table, and
// then aligns each half in the same way. The depth is the logarithm of A's length.
class Aligner {
  public:
    Aligner(std::span<const Token> a, std::span<const Token> b) : a_(a), b_(b) {}

    void run(std::size_t fromA, std::size_t toA, std::size_t fromB, std::size_t toB) {
        if (fromA == toA || fromB == toB)
            return;
        if (toA - fromA == 1) {
            single(fromA, fromB, toB);
            return;
        }
        const std::size_t middle = fromA + (toA - fromA) / 2;
        const std::vector<std::uint64_t> front = scores(fromA, middle, fromB, toB, false);
        const std::vector<std::uint64_t> back = scores(middle, toA, fromB, toB, true);
        std::size_t split = 0;
        for (std::size_t i = 1; i < front.size(); ++i) {
            if (front[i] + back[i] > front[split] + back[split])
                split = i;
        }
        run(fromA, middle, fromB, fromB + split);
        run(middle, toA, fromB + split, toB);
    }

    std::vector<AlignedPair> pairs;

  private:
    void single(std::size_t a, std::size_t fromB, std::size_t toB) {
        std::size_t best = fromB;
        for (std::size_t b = fromB; b < toB; ++b) {
            if (worth(a_[a], b_[b]) > worth(a_[a], b_[best]))
                best = b;
        }
        if (worth(a_[a], b_[best]) > 0)
            pairs.push_back({a, best});
    }

    // For each i: the worth of these members of A aligned with the first i members of B, or, backwards, with
    // all but the first i.
    std::vector<std::uint64_t> scores(std::size_t fromA, std::size_t toA, std::size_t fromB, std::size_t toB,
                                      bool backwards) const {
        const std::size_t width = toB - fromB;
        std::vector<std::uint64_t> row(width + 1);
        for (std::size_t n = 0; n < toA - fromA; ++n) {
            const Token& own = a_[backwards ? toA - 1 - n : fromA + n];
            std::uint64_t diagonal = 0;
            for (std::size_t i = 1; i <= width; ++i) {
                const Token& its = b_[backwards ? toB - i : fromB + i - 1];
                const std::uint64_t beside = diagonal + worth(own, its);
                diagonal = row[i];
                row[i] = std::max({row[i], row[i - 1], beside});
            }
        }
        if (backwards)
            std::reverse(row.begin(), row.end());
        return row;
    }

    std::span<const Token> a_;
    std::span<const Token> b_;
};

}  // namespace

std::optional<std::vector<AlignedPair>> align(std::span<const Token> a, std::span<const Token> b) {
    const auto equal = [](const Token& x, const Token& y) { return x.content == y.content; };
    std::size_t begin = 0;
    while (begin < std::min(a.size(), b.size()) && equal(a[begin], b[begin]))
        ++begin;
    std::size_t end = 0;
    while (end < std::min(a.size(), b.size()) - begin && equal(a[a.size() - 1 - end], b[b.size() - 1 - end]))
        ++end;
    if (std::uint64_t{a.size() - begin - end} * (b.size() - begin - end) > mostCells)
        return std::nullopt;
    Aligner aligner(a, b);
    for (std::size_t i = 0; i < begin; ++i)
        aligner.pairs.push_back({i, i});
    aligner.run(begin, a.size() - end, begin, b.size() - end);
    for (std::size_t i = end; i > 0; --i)
        aligner.pairs.push_back({a.size() - i, b.size() - i});
    return std::move(aligner.pairs);
}

}  // namespace reader
