#include "decoder/layer2.h"

#include <gtest/gtest.h>

#include "tests/decoder/capture.h"

namespace decoder::testing {
namespace {

struct Layer2 : ::testing::Test {
    Layer2() { sapi = tei = 0; }
    ~Layer2() override { sapi = tei = 0; }
};

TEST_F(Layer2, NamesAFrameByItsControlField) {
    const struct {
        const char* says;
        std::vector<unsigned char> octets;
        const char* expected;
    } cases[] = {
        {"link establishment",
         {0x02, 0x01, 0x7F},
         "Command=1   SAPI=0x00\nTEI=0x00\n    0x7f  Set Asynchronous Balanced Mode\n"},
        {"keep-alive",
         {0x00, 0x01, 0x01, 0x05},
         "Response=0    SAPI=0x00\nTEI=0x00\n0x01 0x05  Receive Ready\n"},
        {"information",
         {0x02, 0x01, 0x00, 0x02},
         "Command=1   SAPI=0x00\nTEI=0x00\n0x00 0x02  Information\n"},
        {"information, low bits 2",
         {0x02, 0x01, 0x02, 0x05},
         "Command=1   SAPI=0x00\nTEI=0x00\n0x02 0x05  Information\n"},
        {"SAPI 16, TEI 64",
         {0x40, 0x81, 0x73},
         "Response=0    SAPI=0x10\nTEI=0x40\n    0x73  Unnumbered Acknowledgment\n"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(decodedBy(layer_2, c.octets), c.expected) << c.says;
}

TEST_F(Layer2, NamesExactlyTheseControlOctets) {
    const struct {
        unsigned char control;
        const char* expected;
    } named[] = {
        {0x01, "0x01 0x5a  Receive Ready\n"},
        {0x05, "0x05 0x5a  Receive Not Ready\n"},
        {0x09, "0x09 0x5a  Reject\n"},
        {0x03, "    0x03  Unnumbered Information\n"},
        {0x13, "    0x13  Unnumbered Information\n"},
        {0x0F, "    0x0f  Disconnected Mode\n"},
        {0x1F, "    0x1f  Disconnected Mode\n"},
        {0x43, "    0x43  Disconnect\n"},
        {0x53, "    0x53  Disconnect\n"},
        {0x63, "    0x63  Unnumbered Acknowledgment\n"},
        {0x73, "    0x73  Unnumbered Acknowledgment\n"},
        {0x6F, "    0x6f  Set Asynchronous Balanced Mode\n"},
        {0x7F, "    0x7f  Set Asynchronous Balanced Mode\n"},
        {0x87, "    0x87  Frame Reject\n"},
        {0x97, "    0x97  Frame Reject\n"},
        {0xAF, "    0xaf  Exchange Identification\n"},
        {0xBF, "    0xbf  Exchange Identification\n"},
    };
    for (int control = 0; control < 256; ++control) {
        std::string expected;
        for (const auto& row : named) {
            if (row.control == control)
                expected = row.expected;
        }
        const auto represent = [control](RingBuffer* rb) {
            con_fld_com_rep(rb, static_cast<unsigned char>(control));
        };
        EXPECT_EQ(decodedBy(represent, {0x5A}), expected) << control;
    }
}

TEST_F(Layer2, WritesNothingForAReservedControlFieldNotEvenALineEnd) {
    EXPECT_EQ(decodedBy(layer_2, {0x02, 0x01, 0x0D, 0x05}), "Command=1   SAPI=0x00\nTEI=0x00\n");
    EXPECT_EQ(decodedBy(layer_2, {0x02, 0x01, 0x0D, 0x05}, 0, 0),
              "                                 Command=1   SAPI=0x00\n"
              "                                 TEI=0x00\n"
              "                                 ");
}

TEST_F(Layer2, ShowsTheFieldsOfTeiManagement) {
    EXPECT_EQ(decodedBy(layer_2, {0xFC, 0xFF, 0x03, 0x0F, 0x12, 0x34, 0x01, 0xFF}),
              "Response=0    SAPI=0x3f\n"
              "TEI=0x7f\n"
              "    0x03  Unnumbered Information\n"
              "    0x0f  Layer ME ID\n"
              "    0x1234 Reference Number\n"
              "    0x01 Message ID\n"
              "    0xff Action ID\n");
    EXPECT_EQ(sapi, 0);
    EXPECT_EQ(tei, 0);
}

TEST_F(Layer2, IndentsTheFieldsOfTeiManagement) {
    EXPECT_EQ(decodedBy(layer_2, {0xFE, 0xFF, 0x13, 0x0F, 0x12, 0x05, 0x01, 0xFF}, 0, 0),
              "                                 Command=1   SAPI=0x3f\n"
              "                                 TEI=0x7f\n"
              "                                     0x13  Unnumbered Information\n"
              "                                     0x0f  Layer ME ID\n"
              "                                     0x125 Reference Number\n"
              "                                     0x01 Message ID\n"
              "                                     0xff Action ID\n");
}

TEST_F(Layer2, AManagementFrameLeavesNothingForLayer3) {
    EXPECT_EQ(decoded({0xFC, 0xFF, 0x03, 0x0F, 0x12, 0x34, 0x01, 0xFF}, 0, 1),
              "Response=0    SAPI=0x3f\n"
              "TEI=0x7f\n"
              "    0x03  Unnumbered Information\n"
              "    0x0f  Layer ME ID\n"
              "    0x1234 Reference Number\n"
              "    0x01 Message ID\n"
              "    0xff Action ID\n"
              "Hex Dump: \n"
              "fc ff 03 0f 12 34 01 ff \n");
}

TEST_F(Layer2, UnnumberedInformationOfOtherAddressesHasNoManagementFields) {
    EXPECT_EQ(decodedBy(layer_2, {0xFC, 0x03, 0x03, 0x0F}),
              "Response=0    SAPI=0x3f\nTEI=0x01\n    0x03  Unnumbered Information\n");
    EXPECT_EQ(sapi, 63);
    EXPECT_EQ(tei, 1);
    EXPECT_EQ(decodedBy(layer_2, {0x00, 0xFF, 0x03, 0x0F}),
              "Response=0    SAPI=0x00\nTEI=0x7f\n    0x03  Unnumbered Information\n");
}

TEST_F(Layer2, OtherUnnumberedFramesOfTheManagementAddressHaveNoManagementFields) {
    EXPECT_EQ(decodedBy(layer_2, {0xFC, 0xFF, 0x7F, 0x0F}),
              "Response=0    SAPI=0x3f\nTEI=0x7f\n    0x7f  Set Asynchronous Balanced Mode\n");
    EXPECT_EQ(tei, 127);
}

TEST_F(Layer2, AFrameThatEndsEarlyIsClassifiedByItsLastOctetAndWhatIsMissingIs0) {
    const struct {
        const char* says;
        std::vector<unsigned char> octets;
        const char* expected;
    } cases[] = {
        {"no octet", {}, ""},
        {"one octet, information", {0x02}, "Command=1   SAPI=0x00\n0x02 0x02  Information\n"},
        {"one octet, supervisory", {0x01}, "Response=0    SAPI=0x00\n0x01 0x00  Receive Ready\n"},
        {"one octet, unnumbered", {0x43}, "Command=1   SAPI=0x10\n    0x43  Disconnect\n"},
        {"two octets", {0x02, 0x01}, "Command=1   SAPI=0x00\nTEI=0x00\n0x01 0x00  Receive Ready\n"},
        {"no second control octet",
         {0x02, 0x01, 0x04},
         "Command=1   SAPI=0x00\nTEI=0x00\n0x04 0x04  Information\n"},
        {"management without fields",
         {0xFC, 0xFF, 0x03},
         "Response=0    SAPI=0x3f\nTEI=0x7f\n    0x03  Unnumbered Information\n"
         "    0x00  Layer ME ID\n    0x000 Reference Number\n    0x00 Message ID\n    0x00 Action ID\n"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(decodedBy(layer_2, c.octets), c.expected) << c.says;
}

TEST_F(Layer2, AFrameWithoutASecondAddressOctetKeepsTheTeiBefore) {
    decodedBy(layer_2, {0x02, 0x55, 0x7F});
    EXPECT_EQ(tei, 0x2A);
    decodedBy(layer_2, {0x02});
    EXPECT_EQ(tei, 0x2A);
}

TEST_F(Layer2, AFrameOfOneOctetHasNoLayer3) {
    EXPECT_EQ(decoded({0x02}, 0, 1), "Command=1   SAPI=0x00\n0x02 0x02  Information\nHex Dump: \n02 \n");
}

}  // namespace
}  // namespace decoder::testing
