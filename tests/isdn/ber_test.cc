#include "isdn/ber.h"

#include <gtest/gtest.h>

#include <sstream>

#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::hex;

// "depth tag offset+contents offset+length problem", a value a line.
std::string shown(const BerTree& tree) {
    std::ostringstream out;
    for (const BerValue& value : tree.values()) {
        out << value.depth << " " << toString(value.tag) << (value.constructed ? " constructed " : " ")
            << value.offset << " " << value.contents << "+" << value.length;
        if (value.problem != BerProblem::none)
            out << " " << toString(value.problem);
        out << "\n";
    }
    return out.str();
}

TEST(BerTree, ReadsEachFormOfIdentifierAndLength) {
    struct {
        const char* says;
        const char* octets;
        const char* shows;
    } const cases[] = {
        {"nothing", "", ""},
        {"short form", "02 01 05", "0 INTEGER 0 2+1\n"},
        {"no contents", "05 00", "0 NULL 0 2+0\n"},
        {"two values side by side", "02 01 05 01 01 FF", "0 INTEGER 0 2+1\n0 BOOLEAN 3 5+1\n"},
        {"values in a value", "30 06 02 01 05 0A 01 02",
         "0 SEQUENCE constructed 0 2+6\n1 INTEGER 2 4+1\n1 ENUMERATED 5 7+1\n"},
        {"long form of one octet", "04 81 02 AA BB", "0 OCTET STRING 0 3+2\n"},
        {"long form with leading zeros", "04 84 00 00 00 01 AA", "0 OCTET STRING 0 6+1\n"},
        {"indefinite length", "30 80 02 01 05 00 00 05 00",
         "0 SEQUENCE constructed 0 2+3\n1 INTEGER 2 4+1\n0 NULL 7 9+0\n"},
        {"indefinite in indefinite", "A1 80 30 80 00 00 05 00 00 00",
         "0 [1] constructed 0 2+6\n1 SEQUENCE constructed 2 4+0\n1 NULL 6 8+0\n"},
        {"a value with the tag of end-of-contents", "30 80 00 01 AA 00 00",
         "0 SEQUENCE constructed 0 2+3\n1 END OF CONTENTS 2 4+1\n"},
        {"context, application and private classes", "81 00 41 00 C3 00",
         "0 [1] 0 2+0\n0 [APPLICATION 1] 2 4+0\n0 [PRIVATE 3] 4 6+0\n"},
        {"a tag of two octets more", "9F 81 00 01 AA", "0 [128] 0 4+1\n"},
        {"the smallest tag of the long form", "9F 1F 00", "0 [31] 0 3+0\n"},
        {"the largest tag", "9F 8F FF FF FF 7F 00", "0 [4294967295] 0 7+0\n"},
    };
    for (const auto& kase : cases)
        EXPECT_EQ(shown(BerTree(hex(kase.octets))), kase.shows) << kase.says;
}

TEST(BerTree, MarksWhatIsDamagedAndGivesItAllThatIsLeft) {
    struct {
        const char* says;
        const char* octets;
        const char* shows;
    } const cases[] = {
        {"an identifier alone", "02", "0 INTEGER 0 1+0 identifier or length is cut off\n"},
        {"a long tag that goes on", "9F 81", "0 [1] 0 2+0 identifier or length is cut off\n"},
        {"a tag beyond 32 bits", "9F 90 80 80 80 00 00", "0 [33554432] 0 5+2 the tag number is too long\n"},
        {"length octets that are missing", "04 82 01",
         "0 OCTET STRING 0 3+0 identifier or length is cut off\n"},
        {"a length of FF", "04 FF 01", "0 OCTET STRING 0 2+1 the length is none\n"},
        {"a length beyond 32 bits", "04 85 01 00 00 00 00", "0 OCTET STRING 0 6+1 the length is none\n"},
        {"a length beyond the end", "04 05 AA BB",
         "0 OCTET STRING 0 2+2 the length reaches beyond the end\n"},
        {"a length beyond the value around it", "30 03 04 05 AA 05 00",
         "0 SEQUENCE constructed 0 2+3\n1 OCTET STRING 2 4+1 the length reaches beyond the end\n0 NULL 5 "
         "7+0\n"},
        {"no end-of-contents", "30 80 05 00",
         "0 SEQUENCE constructed 0 2+2 the end-of-contents octets are missing\n1 NULL 2 4+0\n"},
        {"half an end-of-contents", "30 80 00",
         "0 SEQUENCE constructed 0 2+1 the end-of-contents octets are missing\n"
         "1 END OF CONTENTS 2 3+0 identifier or length is cut off\n"},
        {"a primitive value without an end", "04 80 00 00",
         "0 OCTET STRING 0 2+2 a primitive value of indefinite length\n"},
    };
    for (const auto& kase : cases)
        EXPECT_EQ(shown(BerTree(hex(kase.octets))), kase.shows) << kase.says;
}

TEST(BerTree, LooksNoDeeperThanItsLimit) {
    std::vector<std::uint8_t> octets;
    for (int i = 0; i < 100000; ++i)
        octets.insert(octets.end(), {0x30, 0x80});
    const BerTree tree(octets);
    ASSERT_EQ(tree.values().size(), berDeepest + 1U);
    EXPECT_EQ(tree.values().back().problem, BerProblem::tooDeep);
    EXPECT_EQ(tree.values().back().length, 200000U - 2 * berDeepest - 2);
}

TEST(BerTree, HoldsNoMoreValuesThanItsLimit) {
    std::vector<std::uint8_t> octets;
    for (std::size_t i = 0; i < berMost + 10; ++i)
        octets.insert(octets.end(), {0x05, 0x00});
    const BerTree tree(octets);
    ASSERT_EQ(tree.values().size(), berMost + 1U);
    EXPECT_EQ(tree.values().back().problem, BerProblem::tooMany);
    EXPECT_EQ(tree.values().back().length, 20U);
}

TEST(BerTree, NamesTheChildrenOfAValue) {
    const std::vector<std::uint8_t> octets = hex("30 07 30 03 02 01 05 05 00 05 00");
    const BerTree tree(octets);
    EXPECT_EQ(tree.childrenOf(0), (std::vector<std::size_t>{1, 3}));
    EXPECT_EQ(tree.childrenOf(1), (std::vector<std::size_t>{2}));
    EXPECT_EQ(tree.childrenOf(2), std::vector<std::size_t>());
    EXPECT_EQ(tree.childrenOf(4), std::vector<std::size_t>());
}

TEST(BerContents, IntegersAreTwosComplementOfAtMostEightOctets) {
    EXPECT_EQ(berIntegerOf(hex("00")), 0);
    EXPECT_EQ(berIntegerOf(hex("7F")), 127);
    EXPECT_EQ(berIntegerOf(hex("00 80")), 128);
    EXPECT_EQ(berIntegerOf(hex("80")), -128);
    EXPECT_EQ(berIntegerOf(hex("FF 7F")), -129);
    EXPECT_EQ(berIntegerOf(hex("7F FF FF FF FF FF FF FF")), INT64_MAX);
    EXPECT_EQ(berIntegerOf(hex("80 00 00 00 00 00 00 00")), INT64_MIN);
    EXPECT_EQ(berIntegerOf(hex("01 00 00 00 00 00 00 00 00")), std::nullopt);
    EXPECT_EQ(berIntegerOf({}), std::nullopt);
}

TEST(BerContents, BooleansAreOneOctet) {
    EXPECT_EQ(berBooleanOf(hex("00")), false);
    EXPECT_EQ(berBooleanOf(hex("FF")), true);
    EXPECT_EQ(berBooleanOf(hex("01")), true);
    EXPECT_EQ(berBooleanOf({}), std::nullopt);
    EXPECT_EQ(berBooleanOf(hex("00 00")), std::nullopt);
}

TEST(BerContents, ObjectIdentifiersAreArcs) {
    EXPECT_EQ(berObjectIdentifierOf(hex("04 00 82 67 01 02")), "0.4.0.359.1.2");
    EXPECT_EQ(berObjectIdentifierOf(hex("2A 86 48 CE 15 00 08")), "1.2.840.10005.0.8");
    EXPECT_EQ(berObjectIdentifierOf(hex("88 37 03")), "2.999.3");  // the example of X.690 8.19.5
    EXPECT_EQ(berObjectIdentifierOf(hex("2B")), "1.3");
    EXPECT_EQ(berObjectIdentifierOf({}), std::nullopt);
    EXPECT_EQ(berObjectIdentifierOf(hex("2B 86")), std::nullopt);
    EXPECT_EQ(berObjectIdentifierOf(hex("FF FF FF FF FF FF FF FF FF FF 7F")), std::nullopt);
}

}  // namespace
