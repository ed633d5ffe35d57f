#include "decoder/frame.h"

#include <gtest/gtest.h>

#include "tests/decoder/capture.h"

namespace decoder::testing {
namespace {

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

TEST(Frame, IsComposedBehindWhatWasComposedBeforeAndLeftToBeHandedOver) {
    Capture log;
    text("RX Frame\n");
    parse_isdn_frame(cursorOver({0x02}));
    const std::string whole = "RX Frame\nCommand=1   SAPI=0x00\n0x02 0x02  Information\nHex Dump: \n\n";
    EXPECT_EQ(lineBuffer.composed(), whole);
    EXPECT_EQ(log.text(), whole);
}

}  // namespace
}  // namespace decoder::testing
