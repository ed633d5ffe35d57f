#include "redaction/Pseudonyms.h"

#include <gtest/gtest.h>

#include <set>
#include <vector>

#include "tests/redaction/redacted.h"

namespace redaction {
namespace {

using Characters = Pseudonyms::Characters;

Key keyOf(std::uint8_t seed, unsigned keepPrefix = 0) {
    Key key;
    key.secret.fill(seed);
    key.manner.keepPrefix = keepPrefix;
    return key;
}

std::string replaced(Pseudonyms& pseudonyms, const std::string& text, Characters kind = Characters::number,
                     std::string before = "") {
    std::vector<std::uint8_t> octets(text.begin(), text.end());
    pseudonyms.replaceCharacters(octets, before, kind);
    return {octets.begin(), octets.end()};
}
std::string redacted(const std::string& text, const Key& key = keyOf(1),
                     Characters kind = Characters::number) {
    return replaced(*makePseudonyms(key, Direction::redact), text, kind);
}
std::string restored(const std::string& text, const Key& key = keyOf(1),
                     Characters kind = Characters::number) {
    return replaced(*makePseudonyms(key, Direction::restore), text, kind);
}

TEST(Pseudonyms, areTheSameTomorrow) {
    EXPECT_EQ(redacted("0301234567"), redacted("0301234567"));
    // Worked out by another program: whatever this one becomes, it undoes what it has redacted.
    EXPECT_EQ(redacted("0123456789"), "9837162863");
}

TEST(Pseudonyms, dependOnTheKey) { EXPECT_NE(redacted("0301234567"), redacted("0301234567", keyOf(2))); }

TEST(Pseudonyms, leaveNoCharacterAsItWas) {
    std::string all;
    for (int character = 0; character < 256; ++character) {
        if (character != '*' && character != '#')
            all += static_cast<char>(character);
    }
    for (std::uint8_t seed = 0; seed < 20; ++seed) {
        const std::string other = redacted(all, keyOf(seed), Characters::text);
        ASSERT_EQ(other.size(), all.size());
        for (std::size_t i = 0; i < all.size(); ++i)
            ASSERT_NE(other[i], all[i]) << i;
    }
}

TEST(Pseudonyms, replaceEachCharacterByOneOfItsKind) {
    const struct { char first, last; } kinds[] = {{'0', '9'}, {'A', 'Z'}, {'a', 'z'}};
    for (const auto& [first, last] : kinds) {
        std::set<char> others;
        for (char character = first; character <= last; ++character) {
            const char other = redacted(std::string(1, character), keyOf(1), Characters::text)[0];
            EXPECT_TRUE(first <= other && other <= last) << character;
            others.insert(other);
        }
        EXPECT_EQ(others.size(), static_cast<std::size_t>(last - first + 1)) << "two have one pseudonym";
    }
}

TEST(Pseudonyms, keepStarAndNumberSign) {
    const std::string other = redacted("*21*#");
    EXPECT_EQ(other[0], '*');
    EXPECT_EQ(other.substr(3), "*#");
}

TEST(Pseudonyms, dependOnTheDigitsBefore) {
    std::set<std::string> behind;
    for (char first = '0'; first <= '9'; ++first)
        behind.insert(redacted(std::string(1, first) + "5").substr(1));
    EXPECT_GT(behind.size(), 1U);
}

TEST(Pseudonyms, ofEqualBeginningsBeginEqually) {
    EXPECT_EQ(redacted("03012345").substr(0, 5), redacted("03012999").substr(0, 5));
}

TEST(Pseudonyms, doNotDependOnHowANumberIsCut) {
    const auto pseudonyms = makePseudonyms(keyOf(1), Direction::redact);
    std::string before;
    std::string pieces;
    for (const std::string piece : {"0", "301", "", "2345"}) {
        std::vector<std::uint8_t> octets(piece.begin(), piece.end());
        pseudonyms->replaceCharacters(octets, before, Characters::number);
        pieces.append(octets.begin(), octets.end());
    }
    EXPECT_EQ(pieces, redacted("03012345"));
    EXPECT_EQ(before, "03012345");
}

TEST(Pseudonyms, giveANumberInATextTheNumbersPseudonym) {
    EXPECT_EQ(redacted("call 03012345", keyOf(1), Characters::text).substr(5), redacted("03012345"));
}

TEST(Pseudonyms, keepTheDigitsThatAreToBeKept) {
    const std::string other = redacted("03012345", keyOf(1, 3));
    EXPECT_EQ(other.substr(0, 3), "030");
    for (std::size_t i = 3; i < other.size(); ++i)
        EXPECT_NE(other[i], "03012345"[i]);
    EXPECT_EQ(restored(other, keyOf(1, 3)), "03012345");
    EXPECT_NE(redacted("030", keyOf(1, 3), Characters::text), "030") << "a text is no number";
}

TEST(Pseudonyms, areUndone) {
    std::string all;
    for (int character = 0; character < 256; ++character)
        all += static_cast<char>(character);
    for (const std::string& text : {std::string("0301234567"), std::string("Smith, J. *7"), all})
        EXPECT_EQ(restored(redacted(text, keyOf(3), Characters::text), keyOf(3), Characters::text), text);
}

TEST(Pseudonyms, ofOctetsChangeBothHalvesOfEachAndAreUndone) {
    std::vector<std::uint8_t> octets;
    for (unsigned i = 0; i < 256; ++i)
        octets.push_back(static_cast<std::uint8_t>(i));
    const std::vector<std::uint8_t> before = octets;
    makePseudonyms(keyOf(4), Direction::redact)->replaceOctets(octets);
    for (std::size_t i = 0; i < octets.size(); ++i) {
        EXPECT_NE(octets[i] >> 4, before[i] >> 4) << i;
        EXPECT_NE(octets[i] & 15, before[i] & 15) << i;
    }
    makePseudonyms(keyOf(4), Direction::restore)->replaceOctets(octets);
    EXPECT_EQ(octets, before);
}

TEST(CheckOfAKey, tellsKeysAndMannersApart) {
    Key key = test::keyOf(1);
    const std::string check = checkOf(key);
    EXPECT_EQ(check.size(), 16U);
    EXPECT_EQ(checkOf(test::keyOf(1)), check);
    EXPECT_NE(checkOf(test::keyOf(2)), check);
    key.manner.keepPrefix = 3;
    EXPECT_NE(checkOf(key), check);
    key.manner = {.blankShort = true};
    EXPECT_NE(checkOf(key), check);
}

}  // namespace
}  // namespace redaction
