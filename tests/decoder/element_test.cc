#include "decoder/element.h"

#include <gtest/gtest.h>

#include "decoder/elements.h"
#include "tests/decoder/capture.h"

namespace decoder::testing {
namespace {

TEST(ShortElement, AMissingLengthIs0AndTheLengthIsRepeatedWhenNothingFollows) {
    EXPECT_EQ(element({0x79}, on4ess),
              "  1:           RESTART INDICATOR(0x79)\n"
              "  2:           IE Length(0x00)\n"
              "  3:  1------- Extension Bit\n"
              "      -0000--- Spare\n"
              "      -----000 Class\n");
    EXPECT_EQ(element({0x34, 0xFF}, on4ess),
              "  1:           SIGNAL(0x34)\n"
              "  2:           IE Length(0xff)\n"
              "  3:     0xff  Signal Value\n");
}

TEST(ShortElement, OctetsThatTheFrameLacksRepeatTheLastOne) {
    EXPECT_EQ(element({0x1E, 0x02, 0xA1}, on4ess),
              "  1:           PROGRESS INDICATOR(0x1e)\n"
              "  2:           IE Length(0x02)\n"
              "  3:  1------- Extension Bit\n"
              "      -01----- Coding Standard\n"
              "      ---0---- Spare\n"
              "      ----0001 Location\n"
              "  4:  1------- Extension Bit\n"
              "      -0100001 Progress Description\n");
    EXPECT_EQ(element({0x29, 0x05, 'a', 'b'}, on4ess),
              "  1:           DATE/TIME(0x29)\n  2:           IE Length(0x05)\n      abbbb\n");
}

TEST(ShortElement, ALoopOverTheOctetsLeftEndsBelowZeroToo) {
    EXPECT_EQ(element({0x01, 0x00, 0x81, 0x55}, onNtt),
              "  1:           ADVICE OF CHARGE(0x01)\n"
              "  2:           IE Length(0x00)\n"
              "  3:  1------- Extension Bit\n"
              "      -000---- Reserved\n"
              "      -----001 Indication Type\n");
    EXPECT_EQ(element({0x18, 0x00, 0xA9, 0x83, 0x85}, onNet5),
              "  1:           CHANNEL ID(0x18)\n"
              "  2:           IE Length(0x00)\n"
              "  3:  1------- Extension Bit\n"
              "      -0------ Interface ID Present\n"
              "      --1----- Interface Type\n"
              "      ---0---- Spare\n"
              "      ----1--- Preferred/Exclusive\n"
              "      -----0-- D-Channel Indicator\n"
              "      ------01 Info. Channel Sel.\n"
              "3.2:  1------- Extension Bit\n"  // not zero, so once more
              "      -00----- Coding Standard\n"
              "      ---0---- Number Map\n"
              "      ----0011 Channel/Map Element\n");
}

TEST(ShortElement, AGroupThatTheFrameCutsEnds) {
    EXPECT_EQ(element({0x18, 0x02, 0xE9, 0x01}, onNet5),
              "  1:           CHANNEL ID(0x18)\n"
              "  2:           IE Length(0x02)\n"
              "  3:  1------- Extension Bit\n"
              "      -1------ Interface ID Present\n"
              "      --1----- Interface Type\n"
              "      ---0---- Spare\n"
              "      ----1--- Preferred/Exclusive\n"
              "      -----0-- D-Channel Indicator\n"
              "      ------01 Info. Channel Sel.\n"
              "3.1:  0------- Extension Bit\n"
              "      -0000001 Interface Identifier\n");
}

TEST(ShortElement, AGroupWithoutAnyOctetShowsNothing) {
    EXPECT_EQ(element({0x18, 0x02, 0xE9}, onNet5),
              "  1:           CHANNEL ID(0x18)\n"
              "  2:           IE Length(0x02)\n"
              "  3:  1------- Extension Bit\n"
              "      -1------ Interface ID Present\n"
              "      --1----- Interface Type\n"
              "      ---0---- Spare\n"
              "      ----1--- Preferred/Exclusive\n"
              "      -----0-- D-Channel Indicator\n"
              "      ------01 Info. Channel Sel.\n"
              "3.2:  1------- Extension Bit\n"  // octet 3 again
              "      -11----- Coding Standard\n"
              "      ---0---- Number Map\n"
              "      ----1001 Channel/Map Element\n");
}

TEST(ShortElement, OctetsLeftBehindBecomeTheNextIdentifiers) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0x27, 0x02, 0x80, 0xA1}),
              "PD=0x08 SETUP(0x05)\n"
              "  1:           NOTIFICATION INDICATOR(0x27)\n"
              "  2:           IE Length(0x02)\n"
              "  3:  1------- Extension Bit\n"
              "      -0000000 Notification description\n"
              "  1:           SENDING COMPLETE(0xa1)\n");
}

TEST(ShortElement, WithoutAHeaderLineTheLengthLineIsIndentedOnceMore) {
    for (const int trunk : {on5ess, onNi2, noTrunk})
        EXPECT_EQ(element({0x6C, 0x00}, trunk, 0), blanks + blanks + "  2:           IE Length(0x00)\n");
    EXPECT_EQ(element({0x6C, 0x00}, onDms100, 0), blanks + "  1:           CALLING PARTY NUM(0x6c)\n" +
                                                      blanks + "  2:           IE Length(0x00)\n");
}

TEST(ShortElement, ALineThatIsLeftOutHasNoIndent) {
    EXPECT_EQ(element({0x08, 0x02, 0x80, 0x90}, on5ess, 0), blanks + "  1:           CAUSE(0x08)\n" + blanks +
                                                                "  2:           IE Length(0x02)\n" + blanks +
                                                                "  4:  1------- Extension Bit\n");
}

TEST(ShortElement, ATextWithoutALineEndIsFollowedByTheNextLinesIndent) {
    EXPECT_EQ(element({0x20, 0x03, 0x00, 0xA5, 0x20}, on4ess, 0),
              blanks + "  1:           NETWORK SPEC. FAC.(0x20)\n" + blanks +
                  "  2:           IE Length(0x03)\n" + blanks + "  3:     0x00  Length Of Network ID\n" +
                  blanks + "      1------- Parameterized/Binary\n" + blanks +
                  "      -1------ Expansion Bit\n" + blanks + "      --1----- Feature/Service\n" + blanks +
                  "      ---00101" + blanks + "  5:  0------- Spare\n" + blanks +
                  "      -0100000 Parameterized Field\n");
}

TEST(UnreachedDecoders, DecodeWhenTheyAreCalled) {
    const auto call = [](void (*decode)(unsigned char, RingBuffer*)) {
        return [decode](RingBuffer* rb) { decode(0x55, rb); };
    };
    EXPECT_EQ(decodedBy(call(service_indicator), {0x01, 0x80}), "");
    EXPECT_EQ(decodedBy(call(end_pointID), {0x01, 0x81}),
              "  1:           ENDPOINT IDENTIFIER(0x55)\n"
              "  2:           IE Length(0x01)\n"
              "  3:  1------- Extension Bit\n"
              "      -0000001 User Service ID\n");
    EXPECT_EQ(decodedBy(call(service_profile_id), {0x02, 0x41, 0xFF}),
              "  1:           SERVICE_PROFILE_ID(0x55)\n"
              "  2:           IE Length(0x02)\n"
              "  3:  0------- Spare\n"
              "      -1000001 SPID\n"
              "  3:  0------- Spare\n"
              "      -1111111 SPID\n");
    EXPECT_EQ(decodedBy(call(call_appearance_ie), {0x03, 0x01, 0x82, 0x03}),
              "  1:           CALL APPEARANCE(0x55)\n"
              "  2:           IE Length(0x03)\n"
              "  3:  0------- Extension Bit\n"
              "      -0000001 Call Appearance ID\n"
              "  4:  1------- Extension Bit\n"
              "      -0000010 Call Appearance ID\n");
}

}  // namespace
}  // namespace decoder::testing
