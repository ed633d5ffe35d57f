#include "isdn/Layer3.h"

#include <gtest/gtest.h>

#include <iomanip>
#include <sstream>
#include <string>

#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::hex;

// "codeset/identifier+contents" of each element, with its problem.
std::string outline(const Elements& elements) {
    std::ostringstream text;
    for (const Element& element : elements) {
        text << unsigned{element.codeset} << "/" << std::hex << std::setw(2) << std::setfill('0')
             << unsigned{element.id} << std::dec << "+" << element.contents.size();
        if (element.problem != Problem::none)
            text << " " << nameOf(element.problem);
        text << " ";
    }
    return text.str();
}

TEST(Layer3, TakesTheHeaderApart) {
    const auto octets = hex("08 02 80 3e 05 04 03 80 90 a2 18 03 a9 83 85");
    const Layer3 message = parseLayer3(octets);
    EXPECT_EQ(message.discriminator, callControl);
    EXPECT_TRUE(message.callReference.flag);
    EXPECT_EQ(message.callReference.value, 0x3EU);
    EXPECT_EQ(message.callReference.length, 2);
    EXPECT_EQ(message.type, message::setup);
    EXPECT_EQ(messageName(message), "SETUP");
    EXPECT_EQ(outline(message.elements), "0/04+3 0/18+3 ");
    EXPECT_EQ(message.problem, Problem::none);
    EXPECT_EQ(message.header.size(), 5U);
}

// The flag is bit 8 of the first octet; everything else is the value (Q.931 4.3).
TEST(Layer3, TakesAReferenceOfAnyLength) {
    const struct {
        const char* text;
        unsigned length;
        bool flag;
        std::uint64_t value;
    } rows[] = {
        {"08 01 7f 05", 1, false, 0x7F},
        {"08 01 ff 05", 1, true, 0x7F},
        {"08 02 7f fe 05", 2, false, 0x7FFE},
        {"08 03 c0 00 01 05", 3, true, 0x400001},
        {"08 09 ff 01 02 03 04 05 06 07 08 05", 9, true, 0x0102030405060708},
    };
    for (const auto& row : rows) {
        const auto octets = hex(row.text);
        const Layer3 message = parseLayer3(octets);
        EXPECT_EQ(message.callReference.length, row.length) << row.text;
        EXPECT_EQ(message.callReference.flag, row.flag) << row.text;
        EXPECT_EQ(message.callReference.value, row.value) << row.text;
        EXPECT_EQ(message.type, message::setup) << row.text;
    }
}

TEST(Layer3, FindsAnElementByIdentifierAndCodeset) {
    const auto octets = hex("08 01 01 7b 70 02 81 31 70 02 81 32 96 70 01 80");
    const Elements elements = parseLayer3(octets).elements;
    EXPECT_EQ(elements.find(0x70).contents[1], '1');
    EXPECT_EQ(elements.find(0x70, 6).contents.size(), 1U);
    EXPECT_TRUE(elements.find(0x70, 5).octets.empty());
    EXPECT_TRUE(elements.find(0x71).octets.empty());
}

TEST(Layer3, KnowsTheDummyAndTheGlobalReference) {
    const auto dummy = hex("08 00 62");
    EXPECT_TRUE(parseLayer3(dummy).callReference.dummy());
    EXPECT_FALSE(parseLayer3(dummy).callReference.global());
    for (const char* text : {"08 01 00 46", "08 02 80 00 46", "08 01 80 46"}) {
        const auto global = hex(text);
        EXPECT_TRUE(parseLayer3(global).callReference.global()) << text;
        EXPECT_FALSE(parseLayer3(global).callReference.dummy()) << text;
    }
}

// Both maintenance discriminators; CONNECT ACKNOWLEDGE has the same code in call control.
TEST(Layer3, NamesMessagesByTheirDiscriminator) {
    EXPECT_EQ(messageName(0x03, 0x0F), "SERVICE");
    EXPECT_EQ(messageName(0x43, 0x0F), "SERVICE");
    EXPECT_EQ(messageName(0x03, 0x07), "SERVICE ACKNOWLEDGE");
    EXPECT_EQ(messageName(0x43, 0x07), "SERVICE ACKNOWLEDGE");
    EXPECT_EQ(messageName(0x08, 0x0F), "CONNECT ACKNOWLEDGE");
    EXPECT_EQ(messageName(0x08, 0x07), "CONNECT");
    EXPECT_EQ(messageName(0x08, 0xFF), "");
    EXPECT_EQ(messageName(0x09, 0x05), "");
}

TEST(Layer3, ChangesTheCodesetAtShifts) {
    // A locking shift to 5, a non-locking one to 6 for one element, a locking one down to 4, which is
    // ignored.
    const auto octets = hex("08 01 01 7b 04 00 95 2a 01 31 9e 01 01 c0 2a 00 94 3b 00 96 a1 01 00");
    EXPECT_EQ(outline(parseLayer3(octets).elements),
              "0/04+0 0/95+0 5/2a+1 5/9e+0 6/01+1 5/2a+0 5/94+0 invalid 5/3b+0 5/96+0 6/a1+0 6/01+0 ");
}

TEST(Layer3, ShowsATruncatedElementWithWhatIsThere) {
    const auto octets = hex("08 01 01 05 70 05 81 31 32");
    const Layer3 message = parseLayer3(octets);
    EXPECT_EQ(outline(message.elements), "0/70+3 truncated ");
    const Layer3 cut = parseLayer3(Octets(octets).first(5));
    EXPECT_EQ(outline(cut.elements), "0/70+0 truncated ");
}

TEST(Layer3, KeepsTheRestOfASegmentRaw) {
    const auto octets = hex("08 01 01 60 00 02 82 05 70 05 81 31");
    const Layer3 message = parseLayer3(octets);
    EXPECT_EQ(outline(message.elements), "0/00+2 ");
    EXPECT_EQ(message.raw.size(), 4U);
}

TEST(Layer3, KeepsOtherProtocolsAndDamagedHeadersRaw) {
    const struct {
        const char* text;
        Problem problem;
        std::size_t raw;
    } rows[] = {
        {"", Problem::tooShort, 0},          {"08", Problem::truncated, 0},
        {"0801", Problem::truncated, 0},     {"08020001", Problem::truncated, 0},
        {"080200", Problem::truncated, 0},   {"08f101", Problem::invalid, 2},
        {"0401020304", Problem::unknown, 4}, {"08010100", Problem::truncated, 1},
        {"0801010031", Problem::none, 0},
    };
    for (const auto& row : rows) {
        const auto octets = hex(row.text);
        const Layer3 message = parseLayer3(octets);
        EXPECT_EQ(message.problem, row.problem) << row.text;
        EXPECT_EQ(message.raw.size(), row.raw) << row.text;
    }
}

// Every octet belongs to the header, to one element or to what is raw, whatever the octets are.
TEST(Layer3, LosesNoOctet) {
    const auto whole =
        hex("08 02 80 3e 05 04 03 80 90 a2 95 18 03 a9 83 85 a1 9e 01 02 c0 81 70 05 81 31 32 33 34");
    for (std::size_t length = 1; length <= whole.size(); ++length) {
        for (std::size_t at = 0; at < length; ++at) {
            for (unsigned value = 0; value < 256; ++value) {
                auto octets = whole;
                octets.resize(length);
                octets[at] = static_cast<std::uint8_t>(value);
                const Layer3 message = parseLayer3(octets);
                std::size_t counted = message.header.size() + message.raw.size();
                for (const Element& element : message.elements)
                    counted += element.octets.size();
                ASSERT_EQ(counted, length);
            }
        }
    }
}

}  // namespace
