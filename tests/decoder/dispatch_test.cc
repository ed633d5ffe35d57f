#include "decoder/dispatch.h"

#include <gtest/gtest.h>

#include "tests/decoder/capture.h"

namespace decoder::testing {
namespace {

TEST(Dispatch, ShowsAnUnknownElementWithItsContents) {
    EXPECT_EQ(element({0x2C, 0x02, 0x31, 0x32}, on4ess),
              "  *Unknown IE: 0x2c\n"
              "  *Unknown IE Length(0x02)\n"
              "  *Unknown IE Content(0x31)\n"
              "  *Unknown IE Content(0x32)\n"
              "\n");
}

TEST(Dispatch, TheEmptyLineAfterAnUnknownElementIsBare) {
    EXPECT_EQ(element({0x2C, 0x01, 0x31}, on4ess, 0), blanks + "  *Unknown IE: 0x2c\n" + blanks +
                                                          "  *Unknown IE Length(0x01)\n" + blanks +
                                                          "  *Unknown IE Content(0x31)\n" + "\n");
}

TEST(Dispatch, AnUnknownIdentifierOf0x80OrAboveIsAllOfItsElement) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0x80, 0xFF, 0xA1}),
              "PD=0x08 SETUP(0x05)\n"
              "  *Unknown IE: 0x80\n"
              "  *Unknown IE: 0xff\n"
              "  1:           SENDING COMPLETE(0xa1)\n");
}

TEST(Dispatch, AnUnknownElementThatTheFrameCutsRepeatsItsLastOctet) {
    EXPECT_EQ(element({0x2C}, on4ess), "  *Unknown IE: 0x2c\n  *Unknown IE Length(0x00)\n\n");
    EXPECT_EQ(element({0x2C, 0x03, 0x31}, on4ess),
              "  *Unknown IE: 0x2c\n"
              "  *Unknown IE Length(0x03)\n"
              "  *Unknown IE Content(0x31)\n"
              "  *Unknown IE Content(0x31)\n"
              "  *Unknown IE Content(0x31)\n"
              "\n");
}

TEST(Dispatch, ShowsSingleOctetElements) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0xA0, 0xA1, 0xB0}, on4ess, 0),
              blanks + "PD=0x08 " + blanks + "SETUP(0x05)\n" + blanks + "  1:           MORE DATA(0xa0)\n" +
                  blanks + "  1:           SENDING COMPLETE(0xa1)\n" + blanks +
                  "  1:           CONGESTION LEVEL(0xb0)\n");
}

TEST(Dispatch, ShowsNothingOfThreeIdentifiersAndTakesTheirOctetsAsIdentifiers) {
    for (const unsigned char id : {0x3A, 0x3B, 0x7B}) {
        EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, id, 0x01, 0x05}, on4ess),
                  "PD=0x08 SETUP(0x05)\n"
                  "  1:           CHANGE STATUS(0x01)\n"
                  "  2:           IE Length(0x05)\n"
                  "  3:  1------- Extension Bit\n"
                  "      -0------ Preference\n"
                  "      --000--- Spare\n"
                  "      -----101 New Status\n");
        EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, id, 0x01, 0x05}, onNi2),
                  "PD=0x08 SETUP(0x05)\n"
                  "  *Unknown IE: 0x05\n"
                  "  *Unknown IE Length(0x00)\n"
                  "\n");
    }
}

TEST(Dispatch, TheIndentOfAnElementThatShowsNothingStays) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0x3A, 0xA1}, on4ess, 0),
              blanks + "PD=0x08 " + blanks + "SETUP(0x05)\n" + blanks + blanks +
                  "  1:           SENDING COMPLETE(0xa1)\n");
    EXPECT_EQ(element({0x01}, onNi2, 0), blanks);
    EXPECT_EQ(element({0x97}, onNet5, 0), blanks);
}

TEST(Dispatch, Identifier1IsChangeStatusOrAdviceOfChargeOrNothingByTheTrunk) {
    for (const int trunk : {on4ess, on5ess, onNet5, onDms100})
        EXPECT_EQ(element({0x01, 0x00}, trunk),
                  "  1:           CHANGE STATUS(0x01)\n  2:           IE Length(0x00)\n");
    EXPECT_EQ(element({0x01, 0x01, 0x81}, onNtt),
              "  1:           ADVICE OF CHARGE(0x01)\n"
              "  2:           IE Length(0x01)\n"
              "  3:  1------- Extension Bit\n"
              "      -000---- Reserved\n"
              "      -----001 Indication Type\n");
    for (const int trunk : {onNi2, noTrunk, 99, -1})
        EXPECT_EQ(element({0x01, 0x00}, trunk), "");
}

TEST(Dispatch, HandsEveryIdentifierToItsDecoder) {
    const struct {
        unsigned char id;
        const char* header;
    } cases[] = {
        {0x01, "CHANGE STATUS(0x01)"},
        {0x03, "BLOCKING CHANNEL ID(0x03)"},
        {0x04, "BEARER CAPABILITY(0x04)"},
        {0x08, "CAUSE(0x08)"},
        {0x0C, "CONNECTED NUMBER(0x0c)"},
        {0x10, "CALL IDENTITY(0x10)"},
        {0x14, "CALL STATE(0x14)"},
        {0x18, "CHANNEL ID(0x18)"},
        {0x1C, "FACILITY(0x1c)"},
        {0x1E, "PROGRESS INDICATOR(0x1e)"},
        {0x20, "NETWORK SPEC. FAC.(0x20)"},
        {0x21, "CALL IDENTITY(0x21)"},
        {0x24, "TERMINAL CAPABILITIES(0x24)"},
        {0x27, "NOTIFICATION INDICATOR(0x27)"},
        {0x28, "DISPLAY(0x28)"},
        {0x29, "DATE/TIME(0x29)"},
        {0x32, "INFORMATION_REQ(0x32)"},
        {0x34, "SIGNAL(0x34)"},
        {0x39, "FEATURE INDICATION(0x39)"},
        {0x6C, "CALLING PARTY NUM(0x6c)"},
        {0x6D, "CALLING PARTY SUBAD(0x6d)"},
        {0x70, "CALLED PARTY NUM(0x70)"},
        {0x71, "CALLED PARTY SUBADD(0x71)"},
        {0x73, "ORIGINAL CALLED NUM(0x73)"},
        {0x74, "REDIRECTING NUMBER(0x74)"},
        {0x78, "TRANSIT NTWRK SEL.(0x78)"},
        {0x79, "RESTART INDICATOR(0x79)"},
        {0x7A, "USER-TO-USER FAC.(0x7a)"},
        {0x7C, "LOW LAYER COMP.(0x7c)"},
        {0x7D, "HIGH LAYER COMP.(0x7d)"},
        {0x7E, "USER-USER(0x7e)"},
        {0x97, "CODESET 7(0x97)"},
        {0x98, "NON-LOCKING SHIFT (0x98)"},
        {0x9E, "NON-LOCKING SHIFT (0x9e)"},
        {0xA0, "MORE DATA(0xa0)"},
        {0xA1, "SENDING COMPLETE(0xa1)"},
        {0xB0, "CONGESTION LEVEL(0xb0)"},
    };
    for (int id = 0; id < 256; ++id) {
        char unknown[24];
        (void)std::snprintf(unknown, sizeof unknown, "  *Unknown IE: 0x%02x", static_cast<unsigned>(id));
        std::string expected = unknown;
        for (const auto& row : cases) {
            if (row.id == id)
                expected = std::string("  1:           ") + row.header;
        }
        if (id == 0x96)
            expected = "  1:            Locking Shift(0x96)";
        if (id == 0x3A || id == 0x3B || id == 0x7B)
            expected.clear();
        const std::string text = element({static_cast<unsigned char>(id)}, on4ess);
        EXPECT_EQ(text.substr(0, text.find('\n')), expected);
    }
    Lock_shift = 0;
}

}  // namespace
}  // namespace decoder::testing
