#include "fleet/subjects.h"

#include <gtest/gtest.h>

#include <set>
#include <string>

namespace {

using fleet::Address;
using fleet::BadSubject;
using fleet::Subject;

TEST(Subjects, AnAddressIsItsFourNames) {
    EXPECT_EQ(toText(Address{"london", "h1", "0", "1"}), "london/h1/0/1");
}

TEST(Subjects, CharactersThatSubjectsMustNotHaveAreEscaped) {
    const Subject subject{5, {"a.b", "*", "> ", "%/\x7e"}};
    EXPECT_EQ(toText(subject), "lapd.5.a%2Eb.%2A.%3E%20.%25%2F%7E");
    EXPECT_EQ(fleet::subjectIn(toText(subject)), subject);
}

TEST(Subjects, ASubjectLeadsBackToItsPartitionAndNames) {
    const Subject subject{63, {"london", "h1", "0", "1"}};
    EXPECT_EQ(toText(subject), "lapd.63.london.h1.0.1");
    EXPECT_EQ(fleet::subjectIn("lapd.63.london.h1.0.1"), subject);
}

TEST(Subjects, WhatNoShipperMadeIsRefused) {
    const std::string longName(65, 'x');
    for (const std::string& text : {
             std::string(),
             std::string("lapd"),
             std::string("lapd."),
             std::string("lapd.1.s.h.b"),
             std::string("lapd.1.s.h.b.d.e"),
             std::string("lapd.64.s.h.b.d"),
             std::string("lapd.01.s.h.b.d"),
             std::string("lapd.-1.s.h.b.d"),
             std::string("lapd..s.h.b.d"),
             std::string("lapd.x.s.h.b.d"),
             std::string("lapd.1..h.b.d"),
             std::string("LAPD.1.s.h.b.d"),
             std::string("xlapd.1.s.h.b.d"),
             std::string("lapd.1.s%2.h.b.d"),
             std::string("lapd.1.s%.h.b.d"),
             std::string("lapd.1.s%zz.h.b.d"),
             std::string("lapd.1.s%41.h.b.d"),  // "A" has no need to be escaped
             std::string("lapd.1.s%2e.h.b.d"),  // lower-case digits
             std::string("lapd.1.s%0A.h.b.d"),  // a control character
             std::string("lapd.1.s%FF.h.b.d"),
             std::string("lapd.1.s\xff.h.b.d"),
             std::string("lapd.1.s t.h.b.d"),
             std::string("lapd.1.") + longName + ".h.b.d",
             std::string("lapd.18446744073709551617.s.h.b.d"),
         })
        EXPECT_THROW(fleet::subjectIn(text), BadSubject) << text;
}

TEST(Subjects, NamesArePrintableAndShort) {
    EXPECT_TRUE(fleet::isName("pri 1/a"));
    EXPECT_TRUE(fleet::isName(std::string(64, 'x')));
    for (const std::string& text : {std::string(), std::string(65, 'x'), std::string("a\nb"),
                                    std::string("caf\xc3\xa9"), std::string(1, '\0'), std::string("\x7f")})
        EXPECT_FALSE(fleet::isName(text)) << text;
}

// FNV-1a of "a" is af63dc4c8601ec8c, of "foobar" 85944171f73967e8 (the hash's published test values); the
// others were computed apart from this program.
TEST(Subjects, ThePartitionIsTheDocumentedHash) {
    EXPECT_EQ(fleet::partitionOf({"london", "h1", "0", "1"}, ""), 3U);
    EXPECT_EQ(fleet::partitionOf({"london", "h1", "0", "1"}, "nfas-a"), 40U);
}

TEST(Subjects, DChannelsOfAGroupHaveOnePartitionWhateverTheirBoards) {
    const unsigned partition = fleet::partitionOf({"london", "h1", "0", "1"}, "nfas-a");
    EXPECT_EQ(fleet::partitionOf({"london", "h2", "7", "2"}, "nfas-a"), partition);
}

TEST(Subjects, ManyDChannelsSpreadOverAllPartitions) {
    std::set<unsigned> met;
    for (int host = 0; host < 100; ++host)
        for (int board = 0; board < 10; ++board)
            met.insert(
                fleet::partitionOf({"site", "h" + std::to_string(host), std::to_string(board), "1"}, ""));
    EXPECT_EQ(met.size(), fleet::partitions);
    EXPECT_LT(*met.rbegin(), fleet::partitions);
}

TEST(Subjects, APartitionsSubjectsAndDeadLettersFollowTheSubject) {
    EXPECT_EQ(fleet::subjectsOf(7), "lapd.7.>");
    EXPECT_EQ(fleet::deadSubjectOf("lapd.7.s.h.b.d"), "lapd-dead.7.s.h.b.d");
    EXPECT_EQ(fleet::deadSubjectOf("lapd.anything"), "lapd-dead.anything");
}

}  // namespace
