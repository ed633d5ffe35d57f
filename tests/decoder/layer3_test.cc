#include "decoder/layer3.h"

#include <gtest/gtest.h>

#include "decoder/elements.h"
#include "decoder/trunks.h"
#include "tests/decoder/capture.h"

namespace decoder::testing {
namespace {

constexpr int noTrunk = 0;
constexpr int on4ess = 1;
constexpr int on5ess = 2;
constexpr int onDms100 = 3;
constexpr int onNtt = 4;
constexpr int onNet5 = 7;
constexpr int onNi2 = 10;

const std::string blanks(33, ' ');

// The element at the start of these octets, its indent included.
std::string element(const std::vector<unsigned char>& octets, int trunk, int indentation = 1) {
    return decodedBy(ie_id, octets, trunk, indentation);
}

// ---- the frame

TEST(Frame, IsLayer2Layer3AndADump) {
    EXPECT_EQ(decoded({0x02, 0x01, 0x00, 0x02, 0x08, 0x02, 0x00, 0x01, 0x05}, on4ess, 1),
              "Command=1   SAPI=0x00\n"
              "TEI=0x00\n"
              "0x00 0x02  Information\n"
              "PD=0x08 Dest=0 CR=0x0001\n"
              "SETUP(0x05)\n"
              "Hex Dump: \n"
              "02 01 00 02 08 02 00 01 05 \n");
}

TEST(Frame, OfThreeOctetsHasNoLayer3) {
    EXPECT_EQ(decoded({0x02, 0x01, 0x7F}, on4ess, 0), blanks + "Command=1   SAPI=0x00\n" + blanks +
                                                          "TEI=0x00\n" + blanks +
                                                          "    0x7f  Set Asynchronous Balanced Mode\n" +
                                                          blanks + "Hex Dump: \n" + blanks + "02 01 7f \n");
}

TEST(Frame, Of20OctetsIsDumpedInTwoLinesOfTen) {
    std::vector<unsigned char> octets(20, 0xA1);
    octets[0] = 0x02;
    octets[1] = 0x01;
    octets[2] = 0x7F;
    const std::string text = decoded(octets, on4ess, 0);
    const std::string dump = blanks + "Hex Dump: \n" + blanks + "02 01 7f a1 a1 a1 a1 a1 a1 a1 \n" + blanks +
                             "a1 a1 a1 a1 a1 a1 a1 a1 a1 a1 \n";
    ASSERT_GE(text.size(), dump.size());
    EXPECT_EQ(text.substr(text.size() - dump.size()), dump);
}

TEST(Frame, WithoutOctetsIsAnEmptyDump) { EXPECT_EQ(decoded({}, on4ess, 1), "Hex Dump: \n\n"); }

TEST(Frame, IsDumpedUpToItsEndWhateverItsLength) {
    for (const int length : {4, 256, 0x7FFFFFFF}) {
        Capture log;
        msglen = length;
        parse_isdn_frame(cursorOver({0x02, 0x01, 0x7F}));
        const std::string text = log.text();
        EXPECT_EQ(text.substr(text.find("Hex")), "Hex Dump: \n02 01 7f \n") << length;
    }
}

TEST(Frame, IsDumpedNoFurtherThanItsLength) {
    Capture log;
    msglen = 2;
    parse_isdn_frame(cursorOver({0x02, 0x01, 0x7F}));
    const std::string text = log.text();
    EXPECT_EQ(text.substr(text.find("Hex")), "Hex Dump: \n02 01 \n");
}

TEST(Frame, IsHandedOverWhole) {
    Capture log;
    text("RX Frame\n");
    parse_isdn_frame(cursorOver({0x02}));
    EXPECT_TRUE(lineBuffer.composed().empty());
    EXPECT_EQ(log.text(), "RX Frame\nCommand=1   SAPI=0x00\n0x02 0x02  Information\nHex Dump: \n\n");
}

// ---- the message header

TEST(MessageHeader, ShowsDiscriminatorCallReferenceAndType) {
    const struct {
        const char* says;
        std::vector<unsigned char> octets;
        const char* expected;
    } cases[] = {
        {"two octets", {0x08, 0x02, 0x00, 0x01, 0x05}, "PD=0x08 Dest=0 CR=0x0001\nSETUP(0x05)\n"},
        {"two octets, flag bit",
         {0x08, 0x02, 0x80, 0x3E, 0x07},
         "PD=0x08 Orig=1 CR=0x803e\nCALL CONNECT(0x07)\n"},
        {"one octet, flag bit", {0x08, 0x01, 0x85, 0x7D}, "PD=0x08 Orig=1CR=0x85\nSTATUS(0x7d)\n"},
        {"one octet", {0x08, 0x01, 0x05, 0x7D}, "PD=0x08 Dest=0CR=0x05\nSTATUS(0x7d)\n"},
        {"dummy", {0x08, 0x00, 0x05}, "PD=0x08 SETUP(0x05)\n"},
        {"three octets are not known", {0x08, 0x03, 0x05}, "PD=0x08 SETUP(0x05)\n"},
        {"maintenance", {0x03, 0x02, 0x00, 0x01, 0x0F}, "PD=0x03 Dest=0 CR=0x0001\nSERVICE(0x0f)\n"},
        {"maintenance, acknowledged",
         {0x43, 0x02, 0x00, 0x01, 0x07},
         "PD=0x43 Dest=0 CR=0x0001\nSERVICE ACKNOWLEDGE(0x07)\n"},
        {"maintenance knows no other", {0x03, 0x02, 0x00, 0x01, 0x05}, "PD=0x03 Dest=0 CR=0x0001\n"},
        {"unknown type",
         {0x08, 0x02, 0x00, 0x01, 0x99},
         "PD=0x08 Dest=0 CR=0x0001\nUnknown Message Type: 0x99\n"},
        {"nothing but the discriminator", {0x08}, "PD=0x08 Unknown Message Type: 0x00\n"},
        {"no call reference value", {0x08, 0x02}, "PD=0x08 Dest=0 CR=0x0000\nUnknown Message Type: 0x00\n"},
        {"half a call reference",
         {0x08, 0x02, 0x85},
         "PD=0x08 Orig=1 CR=0x8585\nUnknown Message Type: 0x00\n"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(decodedBy(layer_3, c.octets), c.expected) << c.says;
}

TEST(MessageHeader, TheTypeIsIndentedWhereverItStands) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x02, 0x00, 0x01, 0x05}, on4ess, 0),
              blanks + "PD=0x08 Dest=0 CR=0x0001\n" + blanks + "SETUP(0x05)\n");
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05}, on4ess, 0),
              blanks + "PD=0x08 " + blanks + "SETUP(0x05)\n");
    EXPECT_EQ(decodedBy(layer_3, {0x03, 0x00, 0x05}, on4ess, 0), blanks + "PD=0x03 " + blanks);
}

TEST(MessageHeader, NamesExactlyTheseTypes) {
    const struct {
        unsigned char type;
        const char* expected;
    } named[] = {
        {0x01, "ALERTING(0x01)\n"},
        {0x02, "CALL PROCEEDING(0x02)\n"},
        {0x03, "CALL PROGRESS(0x03)\n"},
        {0x05, "SETUP(0x05)\n"},
        {0x07, "CALL CONNECT(0x07)\n"},
        {0x0D, "SETUP_ACK(0x0d)\n"},
        {0x0F, "CALL CONNECT ACKNOWLEDGE(0x0f)\n"},
        {0x20, "USER INFORMATION(0x20)\n"},
        {0x45, "CALL DISCONNECT(0x45)\n"},
        {0x46, "RESTART(0x46)\n"},
        {0x4D, "RELEASE(0x4d)\n"},
        {0x4E, "RESTART ACKNOWLEDGE(0x4e)\n"},
        {0x5A, "RELEASE COMPLETE(0x5a)\n"},
        {0x62, "CALL FACILITY(0x62)\n"},
        {0x64, "REGISTER(0x64)\n"},
        {0x6A, "CALL FACILITY ACKNOWLEDGE(0x6a)\n"},
        {0x6E, "NOTIFY(0x6e)\n"},
        {0x72, "CALL FACILITY REJECT(0x72)\n"},
        {0x75, "STATUS EQUIRY(0x75)\n"},
        {0x79, "CONGESTION CONTROL(0x79)\n"},
        {0x7B, "INFORMATION(0x7b)\n"},
        {0x7D, "STATUS(0x7d)\n"},
    };
    prtcol_discr = 0x08;
    for (int type = 0; type < 256; ++type) {
        char unknown[40];
        (void)std::snprintf(unknown, sizeof unknown, "Unknown Message Type: 0x%02x\n",
                            static_cast<unsigned>(type));
        std::string expected = unknown;
        for (const auto& row : named) {
            if (row.type == type)
                expected = row.expected;
        }
        EXPECT_EQ(decodedBy(message_type, {static_cast<unsigned char>(type)}), expected);
    }
}

// ---- dispatch

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
                  "      -----000 New Status\n");
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

// ---- codesets

TEST(Codeset, AfterALockingShiftEveryElementIsOfCodeset6) {
    EXPECT_EQ(
        decodedBy(layer_3, {0x08, 0x00, 0x05, 0x96, 0x28, 0x02, 0x05, 0xAF, 0xA1, 0x00, 0x96, 0x01, 0x00}),
        "PD=0x08 SETUP(0x05)\n"
        "  1:            Locking Shift(0x96)\n"
        "\t     1------- Extension Bit \n"
        "       -001---- Shift Identifier \n"
        "       ----0--- Locking Shift\t\n"
        "      -----110 CODESET 6 \n"
        "  1:           CODESET 6 IE (0x28)\n"
        "  2:           IE Length(0x02)\n"
        "  3:        0x 5 CODESET 6 IE Content\n"
        "  4:        0xaf CODESET 6 IE Content\n"
        "  1:           CODESET 6 IE (0xa1)\n"
        "  2:           IE Length(0x00)\n"
        "  1:           CODESET 6 IE (0x96)\n"
        "  2:           IE Length(0x01)\n"
        "  3:        0x 0 CODESET 6 IE Content\n");
    EXPECT_EQ(Lock_shift, 1);
}

TEST(Codeset, ALockingShiftIsIndentedAndEndsWithItsMessage) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0x96, 0x28, 0x00}, on4ess, 0),
              blanks + "PD=0x08 " + blanks + "SETUP(0x05)\n" + blanks +
                  "  1:            Locking Shift(0x96)\n" + blanks + "\t     1------- Extension Bit \n" +
                  blanks + "       -001---- Shift Identifier \n" + blanks +
                  "       ----0--- Locking Shift\t\n" + blanks + "      -----110 CODESET 6 \n" + blanks +
                  "  1:           CODESET 6 IE (0x28)\n" + blanks + "  2:           IE Length(0x00)\n");
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0xA1}),
              "PD=0x08 SETUP(0x05)\n  1:           SENDING COMPLETE(0xa1)\n");
    EXPECT_EQ(Lock_shift, 0);
}

TEST(Codeset, ANonLockingShiftTo6HoldsForOneElement) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0x9E, 0x28, 0x01, 0x41, 0xA1}, on4ess, 0),
              blanks + "PD=0x08 " + blanks + "SETUP(0x05)\n" + blanks +
                  "  1:           NON-LOCKING SHIFT (0x9e)\n" + blanks +
                  "      10011--- non-locking shift\n" + blanks + "      -----110 Shift to Codeset 6\n" +
                  blanks + "  1:           CODESET 6 IE (0x28)\n" + blanks +
                  "  2:           IE Length(0x01)\n" + blanks + "  3:        0x41 CODESET 6 IE Content\n" +
                  blanks + "  1:           SENDING COMPLETE(0xa1)\n");
}

TEST(Codeset, ANonLockingShiftTo0ChangesNothing) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0x98, 0xA1}),
              "PD=0x08 SETUP(0x05)\n"
              "  1:           NON-LOCKING SHIFT (0x98)\n"
              "      10011--- non-locking shift\n"
              "      -----000 Shift to Codeset 0\n"
              "  1:           SENDING COMPLETE(0xa1)\n");
}

TEST(Codeset, ANonLockingShiftToAnyOtherNamesNoCodeset) {
    const auto shift = [](RingBuffer* rb) { non_locking_shift(0x9D, rb); };
    EXPECT_EQ(decodedBy(shift, {0xA1, 0x00}),
              "  1:           NON-LOCKING SHIFT (0x9d)\n"
              "      10011--- non-locking shift\n");
}

TEST(Codeset, AShiftAtTheEndOfTheFrameShowsAnElementOfZeros) {
    EXPECT_EQ(element({0x9E}, on4ess),
              "  1:           NON-LOCKING SHIFT (0x9e)\n"
              "      10011--- non-locking shift\n"
              "      -----110 Shift to Codeset 6\n"
              "  1:           CODESET 6 IE (0x00)\n"
              "  2:           IE Length(0x00)\n");
}

TEST(Codeset, ShiftTo7IsNamedOn4essAndLeavesTheElementsAsTheyAre) {
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0x97, 0xA1}, on4ess),
              "PD=0x08 SETUP(0x05)\n"
              "  1:           CODESET 7(0x97)\n"
              "  1:           SENDING COMPLETE(0xa1)\n");
    EXPECT_EQ(decodedBy(layer_3, {0x08, 0x00, 0x05, 0x97, 0xA1}, onNi2),
              "PD=0x08 SETUP(0x05)\n  1:           SENDING COMPLETE(0xa1)\n");
}

// ---- where the frame and the length octet disagree

TEST(ShortElement, BeforeItsFirstOctetTheOctetIs0) {
    EXPECT_EQ(element({0x79}, on4ess),
              "  1:           RESTART INDICATOR(0x79)\n"
              "  2:           IE Length(0x00)\n"
              "  3:  1------- Extension Bit\n"
              "      -0000--- Spare\n"
              "      -----000 Class\n");
    EXPECT_EQ(element({0x34, 0xFF}, on4ess),
              "  1:           SIGNAL(0x34)\n"
              "  2:           IE Length(0xff)\n"
              "  3:     0x00  Signal Value\n");
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
