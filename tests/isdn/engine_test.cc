// What holds for the fields of any element, whatever its octets are.
#include <gtest/gtest.h>

#include <string>

#include "isdn/Table.h"
#include "isdn/values.h"
#include "isdn/words.h"
#include "tests/isdn/coverage.h"
#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::bitsCovered;
using isdn::testing::hex;

constexpr Variant variants[] = {Variant::net5, Variant::ni2,    Variant::ess4,
                                Variant::ess5, Variant::dms100, Variant::ntt};

// A whole element of each kind, some with every octet that its table knows.
const char* const elements[] = {
    "00028205",
    "010102",
    "0303a18385",
    "04038090a3",
    "040a18d8860821 8a3d 9bc2e6",
    "04088890211f4a6f bdff",
    "08050380e6 333033",
    "0804 82e4 18 70",
    "0803 8295 04",
    "0c05 2183 313233",
    "0d05 91a1020103",
    "1003 010203",
    "14010a",
    "1803a98385",
    "1807 e9 0183 83 030487",
    "1806 e1 81 93 00ff01",
    "18018a",
    "1c0c 91a10a020105020122040144",
    "1e028288",
    "2006 03a1323838 e2",
    "2101aa",
    "2401aa",
    "270184",
    "2805 b1 41424344",
    "280a 80 8b03313233 8d024142",
    "29061a0b150a0b0c",
    "2c03 2a3231",
    "3202 0183",
    "340140",
    "380181",
    "3902 8101",
    "3a04 30313233",
    "3b02 8181",
    "400488888888",
    "4209 0001 82 0001 82 0001 83",
    "4303 000182",
    "440198",
    "45028282",
    "46028787",
    "470381 3132",
    "4a0181",
    "6c06 2181 31323334",
    "6d05 8050 313233",
    "6d05 a8 12 34 5f 01",
    "7005 a1 31323334",
    "7307 01018185 313233",
    "7408 21 01 8f 31323334",
    "7606 2181 31323334",
    "7805 a1 333838",
    "790187",
    "7a03 040102",
    "7b0101",
    "7c0f 18 c0 90 21 8f 4a 5d e8 46 48 82 6b 4c 8c 7f",
    "7c06 8890 6102 f0 81",
    "7d03 9101 81",
    "7e04 04 414243",
    "7f020102",
    "96",
    "9e",
    "a0",
    "a1",
    "b0",
    "d2",
    "c3",
};

void expectCoverage(const std::vector<std::uint8_t>& octets) {
    for (const Variant variant : variants) {
        for (std::uint8_t codeset = 0; codeset < 8; ++codeset) {
            const Element element = *Elements(octets, codeset).begin();
            Fields fields;
            fieldsOf(element, variant, fields);
            ASSERT_EQ(bitsCovered(fields, element.octets), element.octets.size() * 8)
                << "identifier " << unsigned{element.id} << " of codeset " << unsigned{codeset} << ", "
                << octets.size() << " octets, variant " << static_cast<int>(variant);
            std::string line;
            appendWords(line, element, variant);
        }
    }
}

// Explaining and rewriting rely on it.
TEST(Engine, CoversEachBitOfAnElementOnceWhateverItsOctetsAre) {
    for (const char* text : elements) {
        const auto whole = hex(text);
        for (std::size_t length = 1; length <= whole.size(); ++length) {
            auto cut = whole;
            cut.resize(length);
            expectCoverage(cut);
            if (length > 1) {
                cut[1] = static_cast<std::uint8_t>(length - 2);
                expectCoverage(cut);
            }
        }
        for (std::size_t at = 0; at < whole.size(); ++at) {
            for (const unsigned change : {0x01U, 0x02U, 0x10U, 0x20U, 0x40U, 0x80U, 0xFFU}) {
                auto changed = whole;
                changed[at] = static_cast<std::uint8_t>(changed[at] ^ change);
                expectCoverage(changed);
            }
        }
    }
}

// Both read the same octets by rules that are written twice: the tables, and plain code.
TEST(Values, AgreeWithTheFieldsOfTheTables) {
    for (const char* text : elements) {
        const auto whole = hex(text);
        for (std::size_t at = 1; at < whole.size(); ++at) {
            for (unsigned value = 0; value < 256; ++value) {
                auto octets = whole;
                octets[at] = static_cast<std::uint8_t>(value);
                const Element element = *Elements(octets).begin();
                Fields fields;
                fieldsOf(element, Variant::net5, fields);
                SCOPED_TRACE(std::string(text) + " octet " + std::to_string(at) + " is " +
                             std::to_string(value));
                if (const auto number = partyNumber(element)) {
                    const Field* const digits = fields.find("digits");
                    const bool same = digits == nullptr ? number->digits.empty()
                                                        : digits->at.data() == number->digitOctets.data();
                    ASSERT_TRUE(same);
                }
                if (const auto found = cause(element)) {
                    const Field* const field = fields.find("cause value");
                    ASSERT_NE(field, nullptr);
                    ASSERT_EQ(field->value, found->value);
                }
                if (const auto found = progress(element)) {
                    const Field* const field = fields.find("progress description");
                    ASSERT_NE(field, nullptr);
                    ASSERT_EQ(field->value, found->value);
                }
                const auto found = channelId(element);
                if (found && found->selection == ChannelId::Selection::indicated) {
                    for (const Field& field : fields) {
                        if (field.name == "channel number") {
                            ASSERT_TRUE(found->channels[field.value & 0x7F]);
                        }
                    }
                }
            }
        }
    }
}

// A row may cite a standard of its own.
TEST(Fields, CiteTheirClauses) {
    const auto octets = hex("08 02 82 91");
    Fields fields;
    fieldsOf(*Elements(octets).begin(), Variant::net5, fields);
    ASSERT_NE(fields.find("location"), nullptr);
    EXPECT_EQ(fields.find("location")->clause, "Q.850 2.2");
    EXPECT_EQ(fields.find("cause value")->clause, "Q.850 table 1");
    for (const char* text : elements) {
        const auto whole = hex(text);
        Fields all;
        fieldsOf(*Elements(whole).begin(), Variant::ni2, all);
        for (const Field& field : all) {
            EXPECT_FALSE(field.clause.empty()) << text << " " << field.name;
            EXPECT_FALSE(field.octet.empty()) << text << " " << field.name;
            EXPECT_FALSE(field.name.empty()) << text << " " << field.octet;
        }
    }
}

}  // namespace
