#include "reader/align.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>

namespace reader {

namespace {

// A letter is a kind, a capital one another content of it.
std::vector<Token> tokens(const std::string& letters) {
    std::vector<Token> series;
    for (const char letter : letters)
        series.push_back({static_cast<std::uint32_t>(letter | 0x20), static_cast<std::uint32_t>(letter)});
    return series;
}

std::string aligned(const std::string& a, const std::string& b) {
    std::string text;
    const std::vector<AlignedPair> pairs = align(tokens(a), tokens(b)).value();
    for (const AlignedPair& pair : pairs)
        text += {a[pair.a], b[pair.b], ' '};
    return text;
}

// The most pairs that are possible, and among them equal ones, by the whole table.
std::pair<std::size_t, std::size_t> best(const std::string& a, const std::string& b) {
    std::vector<std::vector<std::pair<std::size_t, std::size_t>>> table(
        a.size() + 1, std::vector<std::pair<std::size_t, std::size_t>>(b.size() + 1));
    for (std::size_t i = 1; i <= a.size(); ++i) {
        for (std::size_t j = 1; j <= b.size(); ++j) {
            table[i][j] = std::max(table[i - 1][j], table[i][j - 1]);
            auto beside = table[i - 1][j - 1];
            if ((a[i - 1] | 0x20) == (b[j - 1] | 0x20)) {
                ++beside.first;
                beside.second += a[i - 1] == b[j - 1] ? 1 : 0;
                table[i][j] = std::max(table[i][j], beside);
            }
        }
    }
    return table[a.size()][b.size()];
}

}  // namespace

TEST(Align, PutsEqualSeriesSideBySide) {
    EXPECT_EQ(aligned("abcd", "abcd"), "aa bb cc dd ");
    EXPECT_EQ(aligned("", "abc"), "");
}

TEST(Align, PutsMembersOfAKindBesideEachOtherThoughTheyDiffer) {
    EXPECT_EQ(aligned("aBc", "Abc"), "aA Bb cc ");
    EXPECT_EQ(aligned("axb", "ab"), "aa bb ");
}

TEST(Align, PrefersEqualMembersOfAKind) {
    EXPECT_EQ(aligned("xay", "xAay"), "xx aa yy ");
    EXPECT_EQ(aligned("xay", "xaAy"), "xx aa yy ");
}

TEST(Align, FindsTheMostPairsInAnySeries) {
    std::mt19937 random(7);
    for (int round = 0; round < 300; ++round) {
        std::string a(random() % 30, ' '), b(random() % 30, ' ');
        for (std::string* const series : {&a, &b})
            std::generate(series->begin(), series->end(), [&] { return "abcABC"[random() % 6]; });
        const auto pairs = align(tokens(a), tokens(b)).value();
        std::size_t equal = 0;
        for (std::size_t i = 0; i < pairs.size(); ++i) {
            EXPECT_TRUE(i == 0 || (pairs[i - 1].a < pairs[i].a && pairs[i - 1].b < pairs[i].b));
            EXPECT_EQ(a[pairs[i].a] | 0x20, b[pairs[i].b] | 0x20);
            equal += a[pairs[i].a] == b[pairs[i].b] ? 1 : 0;
        }
        EXPECT_EQ(std::pair(pairs.size(), equal), best(a, b)) << a << " " << b;
    }
}

TEST(Align, TakesLongSeriesThatAreAlmostEqualAndRefusesOthers) {
    std::string longer(50000, 'a');
    std::string other = longer;
    other[25000] = 'b';
    EXPECT_EQ(align(tokens(longer), tokens(other)).value().size(), 49999U);
    EXPECT_EQ(align(tokens(longer), tokens(std::string(50000, 'b'))), std::nullopt);
}

}  // namespace reader
