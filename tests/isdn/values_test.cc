#include "isdn/values.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::hex;

// An element, and the octets it looks at.
struct Given {
    explicit Given(const char* text, std::uint8_t codeset = 0, bool ofService = false)
        : octets(hex(text)), element(*Elements(octets, codeset, ofService).begin()) {}

    std::vector<std::uint8_t> octets;
    Element element;
};

std::string list(const std::bitset<128>& channels) {
    std::string text;
    for (std::size_t i = 0; i < channels.size(); ++i) {
        if (channels[i])
            text += std::to_string(i) + " ";
    }
    return text;
}

TEST(ChannelId, HoldsWhatWasAskedFor) {
    using enum ChannelId::Selection;
    const struct {
        const char* element;
        ChannelId::Selection selection;
        bool primaryRate, exclusive, dChannel, slotMap;
        int interface;  // -1: implicit
        unsigned type;
        const char* channels;
    } rows[] = {
        {"18 03 a9 83 9e", indicated, true, true, false, false, -1, 3, "30 "},
        {"18 03 a1 83 98", indicated, true, false, false, false, -1, 3, "24 "},
        {"18 04 e9 85 83 81", indicated, true, true, false, false, 5, 3, "1 "},
        {"18 05 e9 01 82 83 81", indicated, true, true, false, false, 130, 3, "1 "},
        {"18 05 a9 83 01 02 83", indicated, true, true, false, false, -1, 3, "1 2 3 "},
        {"18 05 a9 93 00 01 81", indicated, true, true, false, true, -1, 3, "1 8 9 "},
        {"18 06 a9 93 00 00 80 01", indicated, true, true, false, true, -1, 3, "0 15 "},
        {"18 03 a9 86 81", indicated, true, true, false, false, -1, 6, "1 "},
        {"18 01 89", indicated, false, true, false, false, -1, 3, "1 "},
        {"18 01 82", indicated, false, false, false, false, -1, 3, "2 "},
        {"18 01 83", any, false, false, false, false, -1, 3, ""},
        {"18 03 a3 83 81", any, true, false, false, false, -1, 3, ""},
        {"18 01 80", none, false, false, false, false, -1, 3, ""},
        {"18 01 ac", none, true, true, true, false, -1, 3, ""},
        {"18 02 e9 85", indicated, true, true, false, false, 5, 3, ""},
        {"18 01 e9", indicated, true, true, false, false, -1, 3, ""},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.element);
        const auto channel = channelId(Given(row.element).element);
        ASSERT_TRUE(channel);
        EXPECT_EQ(channel->selection, row.selection);
        EXPECT_EQ(channel->primaryRate, row.primaryRate);
        EXPECT_EQ(channel->exclusive, row.exclusive);
        EXPECT_EQ(channel->dChannel, row.dChannel);
        EXPECT_EQ(channel->slotMap, row.slotMap);
        EXPECT_EQ(channel->interface ? static_cast<int>(*channel->interface) : -1, row.interface);
        EXPECT_EQ(channel->channelType, row.type);
        EXPECT_EQ(list(channel->channels), row.channels);
    }
}

TEST(PartyNumber, HoldsTheGroupOfOctet3AndTheDigits) {
    const struct {
        const char* element;
        unsigned type, plan;
        int presentation, screening, reason;  // -1: absent
        const char* digits;
    } rows[] = {
        {"70 04 a1 31 32 33", 2, 1, -1, -1, -1, "123"},
        {"6c 05 21 a2 31 32 33", 2, 1, 1, 2, -1, "123"},
        {"6c 04 c9 31 32 33", 4, 9, -1, -1, -1, "123"},
        {"4c 02 00 c3", 0, 0, 2, 3, -1, ""},
        {"0c 03 11 80 35", 1, 1, 0, 0, -1, "5"},
        {"74 05 21 03 84 35 36", 2, 1, 0, 3, 4, "56"},
        {"76 03 21 81 35", 2, 1, 0, 1, -1, "5"},
        {"73 06 21 03 01 c2 35 36", 2, 1, 0, 3, 1, "56"},
        {"70 01 81", 0, 1, -1, -1, -1, ""},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.element);
        const Given given(row.element);
        const auto number = partyNumber(given.element);
        ASSERT_TRUE(number);
        EXPECT_EQ(number->type, row.type);
        EXPECT_EQ(number->plan, row.plan);
        EXPECT_EQ(number->presentation ? *number->presentation : -1, row.presentation);
        EXPECT_EQ(number->screening ? *number->screening : -1, row.screening);
        EXPECT_EQ(number->reason ? *number->reason : -1, row.reason);
        EXPECT_EQ(number->digits, row.digits);
        EXPECT_EQ(number->digitOctets.size(), number->digits.size());
    }
}

TEST(Cause, HoldsStandardLocationValueAndDiagnostics) {
    const struct {
        const char* element;
        unsigned standard, location;
        int recommendation;
        unsigned value;
        std::size_t diagnostics;
    } rows[] = {
        {"08 02 8a 90", 0, 10, -1, 16, 0},
        {"08 02 e4 91", 3, 4, -1, 17, 0},
        {"08 03 02 84 ff", 0, 2, 4, 127, 0},
        {"08 05 80 e6 33 30 33", 0, 0, -1, 102, 3},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.element);
        const auto found = cause(Given(row.element).element);
        ASSERT_TRUE(found);
        EXPECT_EQ(found->codingStandard, row.standard);
        EXPECT_EQ(found->location, row.location);
        EXPECT_EQ(found->recommendation ? *found->recommendation : -1, row.recommendation);
        EXPECT_EQ(found->value, row.value);
        EXPECT_EQ(found->diagnostics.size(), row.diagnostics);
    }
}

TEST(Values, OfShortElementsAreRead) {
    const auto state = callState(Given("14 01 4a").element);
    ASSERT_TRUE(state);
    EXPECT_EQ(state->codingStandard, 1);
    EXPECT_EQ(state->value, 10);
    EXPECT_EQ(restartClass(Given("79 01 86").element), 6);
    const auto channel = changeStatus(Given("01 01 c2", 0, true).element);
    ASSERT_TRUE(channel);
    EXPECT_TRUE(channel->channel);
    EXPECT_EQ(channel->status, 2);
    const auto other = changeStatus(Given("01 01 81", 6, true).element);
    ASSERT_TRUE(other);
    EXPECT_FALSE(other->channel);
    EXPECT_EQ(other->status, 1);
    const auto found = progress(Given("1e 02 c5 88").element);
    ASSERT_TRUE(found);
    EXPECT_EQ(found->codingStandard, 2);
    EXPECT_EQ(found->location, 5);
    EXPECT_EQ(found->value, 8);
    const auto segment = segmentHeader(Given("00 02 83 05").element);
    ASSERT_TRUE(segment);
    EXPECT_TRUE(segment->first);
    EXPECT_EQ(segment->remaining, 3);
    EXPECT_EQ(segment->messageType, message::setup);
    EXPECT_EQ(keypadDigits(Given("2c 03 2a 32 31").element), "*21");
}

// What each function says of an element: which one it takes it for.
std::string readers(const Element& element) {
    std::string all;
    all += channelId(element) ? "channel " : "";
    all += partyNumber(element) ? "number " : "";
    all += keypadDigits(element).empty() ? "" : "keypad ";
    all += cause(element) ? "cause " : "";
    all += callState(element) ? "state " : "";
    all += restartClass(element) ? "restart " : "";
    all += changeStatus(element) ? "status " : "";
    all += progress(element) ? "progress " : "";
    all += segmentHeader(element) ? "segment " : "";
    return all;
}

TEST(Values, AreThoseOfTheirElementAlone) {
    for (unsigned id = 0; id < 128; ++id) {
        std::vector<std::uint8_t> octets{static_cast<std::uint8_t>(id), 2, 0x81, 0x81};
        std::string expected;
        switch (id) {
            case 0x00:
                expected = "segment ";
                break;
            case 0x01:
                expected = "status ";
                break;
            case 0x08:
                expected = "cause ";
                break;
            case 0x14:
                expected = "state ";
                break;
            case 0x18:
                expected = "channel ";
                break;
            case 0x1E:
                expected = "progress ";
                break;
            case 0x2C:
                expected = "keypad ";
                break;
            case 0x79:
                expected = "restart ";
                break;
            case 0x0C:
            case 0x4C:
            case 0x6C:
            case 0x70:
            case 0x73:
            case 0x74:
            case 0x76:
                expected = "number ";
                break;
            default:
                break;
        }
        EXPECT_EQ(readers(*Elements(octets, 0, true).begin()), expected) << id;
        EXPECT_EQ(readers(*Elements(octets, 5).begin()), "") << id;
        octets.resize(1);
        EXPECT_EQ(readers(*Elements(octets).begin()), "") << id;
    }
    EXPECT_EQ(readers(Element()), "");
    EXPECT_EQ(readers(Given("01 01 c2").element), "") << "it is no SERVICE message";
    EXPECT_EQ(readers(Given("01 01 c2", 6, true).element), "status ");
}

TEST(Values, AreAbsentIfTheirOctetIs) {
    for (const char* text : {"08 01 82", "08 02 02 80", "1e 01 82", "1e 02 02 81", "00 01 80", "01 00",
                             "14 00", "18 00", "79 00", "70 00"})
        EXPECT_EQ(readers(Given(text).element), "") << text;
}

}  // namespace
