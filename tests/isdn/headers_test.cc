// The fields of link headers, management messages and message headers.
#include <gtest/gtest.h>

#include <string>

#include "isdn/Field.h"
#include "tests/isdn/coverage.h"
#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::bitsCovered;
using isdn::testing::hex;

// "octet bits name=value meaning", a line a field; spare bits are left out.
std::string text(const Fields& fields) {
    std::string all;
    for (const Field& field : fields) {
        if (field.kind == Field::Kind::spare)
            continue;
        all.append(field.octet).append(" ").append(field.bits()).append(" ").append(field.name).append("=");
        all += std::to_string(field.value);
        if (!field.meaning.empty())
            all.append(" ").append(field.meaning);
        all += "\n";
    }
    return all;
}

std::string linkText(const char* octetsInHex) {
    const auto octets = hex(octetsInHex);
    Fields fields;
    fieldsOf(parseLayer2(octets), fields);
    return text(fields);
}

std::string messageText(const char* octetsInHex) {
    const auto octets = hex(octetsInHex);
    Fields fields;
    fieldsOf(parseLayer3(octets), fields);
    return text(fields);
}

TEST(LinkHeader, ShowsTheFieldsOfAnInformationFrame) {
    EXPECT_EQ(linkText("02 81 06 09 08 01 01 05"),
              "2 8-3 SAPI=0 call control\n"
              "2 2 C/R=1\n"
              "2 1 address extension=0 the address goes on\n"
              "3 8-2 TEI=64\n"
              "3 1 address extension=1 last octet of the address\n"
              "4 8-2 N(S)=3\n"
              "4 1 format=0 information\n"
              "5 8-2 N(R)=4\n"
              "5 1 P=1\n");
}

TEST(LinkHeader, ShowsTheFieldsOfASupervisoryFrame) {
    EXPECT_EQ(linkText("00 01 09 0b"),
              "2 8-3 SAPI=0 call control\n"
              "2 2 C/R=0\n"
              "2 1 address extension=0 the address goes on\n"
              "3 8-2 TEI=0\n"
              "3 1 address extension=1 last octet of the address\n"
              "4 4-3 function=2 REJ\n"
              "4 2-1 format=1 supervisory\n"
              "5 8-2 N(R)=5\n"
              "5 1 P/F=1\n");
}

TEST(LinkHeader, ShowsTheInformationFieldOfFrameReject) {
    EXPECT_EQ(linkText("00 01 97 0b 0c 0a 0d 0a"),
              "2 8-3 SAPI=0 call control\n"
              "2 2 C/R=0\n"
              "2 1 address extension=0 the address goes on\n"
              "3 8-2 TEI=0\n"
              "3 1 address extension=1 last octet of the address\n"
              "4 8-6 function, upper bits=4\n"
              "4 5 P/F=1\n"
              "4 4-3 function, lower bits=1\n"
              "4 2-1 format=3 unnumbered\n"
              "5 8-1 rejected control field=2828\n"
              "7 8-2 V(S)=5\n"
              "8 8-2 V(R)=6\n"
              "8 1 rejected frame was a=1 response\n"
              "9 4 Z, N(R) invalid=1 yes\n"
              "9 3 Y, information too long=0 no\n"
              "9 2 X, information not permitted=1 yes\n"
              "9 1 W, control field undefined=0 no\n");
}

TEST(LinkHeader, ShowsTeiManagement) {
    EXPECT_EQ(linkText("fe ff 03 0f 12 34 05 80 83"),
              "2 8-3 SAPI=63 management\n"
              "2 2 C/R=1\n"
              "2 1 address extension=0 the address goes on\n"
              "3 8-2 TEI=127 all terminals\n"
              "3 1 address extension=1 last octet of the address\n"
              "4 8-6 function, upper bits=0\n"
              "4 5 P/F=0\n"
              "4 4-3 function, lower bits=0\n"
              "4 2-1 format=3 unnumbered\n"
              "5 8-1 management entity=15 TEI management\n"
              "6 8-1 reference number Ri=4660\n"
              "8 8-1 message=5 identity check response\n"
              "9 8-2 action indicator Ai=64\n"
              "9 1 action extension=0 more follow\n"
              "9 8-2 action indicator Ai=65\n"
              "9 1 action extension=1 the last\n");
}

TEST(LinkHeader, KeepsOtherInformationRawAndPersonal) {
    for (const char* frame : {"00 81 af 82 80 00", "40 81 00 00 10 01 fb", "00 01 01 01 05"}) {
        const auto octets = hex(frame);
        Fields fields;
        fieldsOf(parseLayer2(octets), fields);
        EXPECT_EQ(fields.back().kind, Field::Kind::raw) << frame;
        EXPECT_TRUE(fields.back().personal) << frame;
        EXPECT_EQ(fields.back().name, "information") << frame;
    }
}

TEST(MessageHeader, ShowsDiscriminatorReferenceAndType) {
    EXPECT_EQ(messageText("08 02 83 78 5a"),
              "1 8-1 protocol discriminator=8 call control\n"
              "2 4-1 length of call reference=2\n"
              "3 8 flag=1 to the side that chose it\n"
              "3 7-1 call reference=888\n"
              "5 8-1 message type=90 RELEASE COMPLETE\n");
    EXPECT_EQ(messageText("03 02 00 00 0f"),
              "1 8-1 protocol discriminator=3 maintenance\n"
              "2 4-1 length of call reference=2\n"
              "3 8 flag=0 from the side that chose it\n"
              "3 7-1 call reference=0 global\n"
              "5 8-1 message type=15 SERVICE\n");
    EXPECT_EQ(messageText("08 00 62"),
              "1 8-1 protocol discriminator=8 call control\n"
              "2 4-1 length of call reference=0\n"
              "3 8-1 message type=98 FACILITY\n");
}

TEST(MessageHeader, ShowsANationalTypeASegmentAndAnotherProtocol) {
    EXPECT_EQ(messageText("08 01 01 00 31"),
              "1 8-1 protocol discriminator=8 call control\n"
              "2 4-1 length of call reference=1\n"
              "3 8 flag=0 from the side that chose it\n"
              "3 7-1 call reference=1\n"
              "4 8-1 escape to national types=0\n"
              "5 8-1 message type=49\n");
    EXPECT_EQ(messageText("4e 01 02"),
              "1 8-1 protocol discriminator=78\n"
              "2 8-1 contents=258\n");
    const auto octets = hex("08 01 01 60 00 02 82 05 70 05");
    Fields fields;
    fieldsOf(parseLayer3(octets), fields);
    EXPECT_EQ(fields.back().name, "piece of a message");
    EXPECT_TRUE(fields.back().personal);
}

// Header, elements and what is raw make up the whole of any message; headers alone of any frame.
TEST(Headers, AreCoveredBitByBitWhateverTheirOctetsAre) {
    for (const char* example :
         {"08 02 83 78 00", "08 03 01 02 03 05", "43 01 00 0f", "08 00 62", "fe ff 97 0f 12 34 05 80 83",
          "00 01 09 0b 03", "02 01 af 82 80", "3e 01 97 01 02 03 04 05 06"}) {
        const auto whole = hex(example);
        for (std::size_t length = 1; length <= whole.size(); ++length) {
            for (std::size_t at = 0; at < length; ++at) {
                for (unsigned value = 0; value < 256; ++value) {
                    auto octets = whole;
                    octets.resize(length);
                    octets[at] = static_cast<std::uint8_t>(value);
                    Fields fields;
                    const Layer2 frame = parseLayer2(octets);
                    fieldsOf(frame, fields);
                    const std::size_t message = frame.carriesMessage() ? frame.information.size() : 0;
                    ASSERT_EQ(bitsCovered(fields, octets), (length - message) * 8);
                    fields.clear();
                    const Layer3 layer3 = parseLayer3(octets);
                    fieldsOf(layer3, fields);
                    if (!layer3.elements.octets().empty())
                        continue;
                    ASSERT_EQ(bitsCovered(fields, octets), length * 8) << at << " " << value;
                }
            }
        }
    }
}

}  // namespace
