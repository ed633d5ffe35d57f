// Nothing that names a person gets through, whatever the frames.
#include <gtest/gtest.h>

#include "tests/redaction/people.h"

namespace redaction {
namespace {

using isdn::Variant;
using test::Bytes;
using test::Passed;
using test::People;
using test::peopleOf;

constexpr Variant variants[] = {Variant::net5, Variant::ni2,    Variant::ess4,
                                Variant::ess5, Variant::dms100, Variant::ntt};
constexpr unsigned traces = 15;  // for each variant

template <class Test>
void forEachTrace(Test test) {
    unsigned structure = 0;
    for (const Variant variant : variants) {
        for (unsigned i = 0; i < traces; ++i)
            test(++structure, variant);
    }
}

TEST(People, ofTracesThatDifferOnlyInThemCannotBeRecovered) {
    forEachTrace([](unsigned structure, Variant variant) {
        test::ConstantPseudonyms constant;
        const People one = peopleOf(structure, 1, variant);
        const People other = peopleOf(structure, 2, variant);
        const std::vector<Passed> first = test::redacted(one.frames, constant, variant);
        const std::vector<Passed> second = test::redacted(other.frames, constant, variant);
        ASSERT_EQ(first.size(), second.size());
        bool differed = false;
        for (std::size_t i = 0; i < first.size(); ++i) {
            differed = differed || one.frames[i].octets != other.frames[i].octets;
            ASSERT_EQ(test::textOf(first[i].octets), test::textOf(second[i].octets))
                << "frame " << i << " of trace " << structure;
        }
        ASSERT_TRUE(differed);
    });
}

TEST(People, leaveNoNumberAndNoNameInAFrame) {
    constexpr std::size_t telling = 8;
    std::size_t secrets = 0;
    forEachTrace([&](unsigned structure, Variant variant) {
        const auto pseudonyms = makePseudonyms(test::keyOf(9), Direction::redact);
        const People people = peopleOf(structure, structure, variant);
        const std::vector<Passed> after = test::redacted(people.frames, *pseudonyms, variant);
        secrets += people.secrets.size();
        for (std::size_t i = 0; i < after.size(); ++i) {
            for (const std::string& secret : people.secrets) {
                // One of few characters may be the pseudonym of another.
                const bool matters = secret.size() >= telling || test::holds(people.frames[i].octets, secret);
                ASSERT_FALSE(matters && test::holds(after[i].octets, secret))
                    << secret << " in frame " << i << " of trace " << structure;
            }
        }
    });
    EXPECT_GT(secrets, 5'000U);
}

TEST(People, keepTheLengthAndThePlanOfTheirFrames) {
    forEachTrace([](unsigned structure, Variant variant) {
        const auto pseudonyms = makePseudonyms(test::keyOf(9), Direction::redact);
        const std::vector<Passed> before = peopleOf(structure, 1, variant).frames;
        const std::vector<Passed> after = test::redacted(before, *pseudonyms, variant);
        for (std::size_t i = 0; i < before.size(); ++i) {
            ASSERT_EQ(after[i].octets.size(), before[i].octets.size());
            ASSERT_EQ(planOfFrame(after[i].octets, variant), planOfFrame(before[i].octets, variant));
        }
    });
}

// Blanks: 0; ff in displays and in damaged facilities; 7f for an element that a message ends in; 80 and the
// digit 0.
TEST(People, areRestoredExceptWhereTheyWereBlanked) {
    std::size_t restoredOctets = 0;
    std::size_t blanks = 0;
    forEachTrace([&](unsigned structure, Variant variant) {
        const auto redact = makePseudonyms(test::keyOf(9), Direction::redact);
        const auto restore = makePseudonyms(test::keyOf(9), Direction::restore);
        const std::vector<Passed> before = peopleOf(structure, 1, variant).frames;
        const std::vector<Passed> after = test::redacted(before, *redact, variant);
        const std::vector<Passed> again = test::redacted(after, *restore, variant);
        for (std::size_t i = 0; i < before.size(); ++i) {
            for (std::size_t at = 0; at < before[i].octets.size(); ++at) {
                const std::uint8_t octet = after[i].octets[at];
                const bool isBack = again[i].octets[at] == before[i].octets[at];
                restoredOctets += isBack && octet != before[i].octets[at] ? 1 : 0;
                blanks += isBack ? 0 : 1;
                const bool isBlank =
                    octet == 0 || octet == 0x7F || octet == 0x80 || octet == 0xFF || octet == '0';
                ASSERT_TRUE(isBack || isBlank) << "frame " << i;
            }
        }
    });
    EXPECT_GT(restoredOctets, blanks / 2);
}

TEST(People, haveOtherPseudonymsByAnotherKey) {
    const People people = peopleOf(1, 1, Variant::net5);
    const auto one = makePseudonyms(test::keyOf(1), Direction::redact);
    const auto other = makePseudonyms(test::keyOf(2), Direction::redact);
    const auto again = makePseudonyms(test::keyOf(1), Direction::redact);
    std::size_t different = 0;
    const std::vector<Passed> first = test::redacted(people.frames, *one);
    const std::vector<Passed> second = test::redacted(people.frames, *other);
    const std::vector<Passed> third = test::redacted(people.frames, *again);
    for (std::size_t i = 0; i < first.size(); ++i) {
        different += first[i].octets != second[i].octets ? 1 : 0;
        EXPECT_EQ(first[i].octets, third[i].octets);
    }
    EXPECT_GT(different, first.size() / 4);
}

}  // namespace
}  // namespace redaction
