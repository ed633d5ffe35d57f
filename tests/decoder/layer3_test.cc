#include "decoder/layer3.h"

#include <gtest/gtest.h>

#include "tests/decoder/capture.h"

namespace decoder::testing {
namespace {

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
        {"no call reference value", {0x08, 0x02}, "PD=0x08 Dest=0 CR=0x0202\nUnknown Message Type: 0x00\n"},
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

}  // namespace
}  // namespace decoder::testing
