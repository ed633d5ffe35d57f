#include "isdn/Layer2.h"

#include <gtest/gtest.h>

#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::hex;

// Control fields of Q.921 table 5, octets 4 and 5.
TEST(Layer2, KnowsEachFrameTypeByItsControlField) {
    const struct {
        const char* control;
        FrameType type;
        const char* name;
        unsigned ns, nr;
        bool pf;
    } rows[] = {
        {"0000", FrameType::I, "I", 0, 0, false},
        {"fe01", FrameType::I, "I", 127, 0, true},
        {"02fe", FrameType::I, "I", 1, 127, false},
        {"0103", FrameType::RR, "RR", 0, 1, true},
        {"0504", FrameType::RNR, "RNR", 0, 2, false},
        {"09ff", FrameType::REJ, "REJ", 0, 127, true},
        {"6f", FrameType::SABME, "SABME", 0, 0, false},
        {"7f", FrameType::SABME, "SABME", 0, 0, true},
        {"2f", FrameType::SABM, "SABM", 0, 0, false},
        {"3f", FrameType::SABM, "SABM", 0, 0, true},
        {"0f", FrameType::DM, "DM", 0, 0, false},
        {"1f", FrameType::DM, "DM", 0, 0, true},
        {"03", FrameType::UI, "UI", 0, 0, false},
        {"13", FrameType::UI, "UI", 0, 0, true},
        {"43", FrameType::DISC, "DISC", 0, 0, false},
        {"53", FrameType::DISC, "DISC", 0, 0, true},
        {"63", FrameType::UA, "UA", 0, 0, false},
        {"73", FrameType::UA, "UA", 0, 0, true},
        {"87", FrameType::FRMR, "FRMR", 0, 0, false},
        {"97", FrameType::FRMR, "FRMR", 0, 0, true},
        {"af", FrameType::XID, "XID", 0, 0, false},
        {"bf", FrameType::XID, "XID", 0, 0, true},
        {"e3", FrameType::UNKNOWN, "UNKNOWN", 0, 0, false},
        {"0d03", FrameType::UNKNOWN, "UNKNOWN", 0, 1, true},
    };
    for (const auto& row : rows) {
        const auto octets = hex(std::string("0001") + row.control);
        const Layer2 frame = parseLayer2(octets);
        SCOPED_TRACE(row.control);
        EXPECT_EQ(frame.type, row.type);
        EXPECT_EQ(nameOf(frame.type), row.name);
        EXPECT_EQ(frame.ns, row.ns);
        EXPECT_EQ(frame.nr, row.nr);
        EXPECT_EQ(frame.pf, row.pf);
        EXPECT_EQ(frame.header.size(), octets.size());
        EXPECT_TRUE(frame.information.empty());
        EXPECT_EQ(frame.problem, row.type == FrameType::UNKNOWN ? Problem::unknown : Problem::none);
    }
}

TEST(Layer2, TakesTheAddressApart) {
    const auto octets = hex("fe ff 03 0f 12 34 01 ff");
    const Layer2 frame = parseLayer2(octets);
    EXPECT_EQ(frame.sapi, 63);
    EXPECT_TRUE(frame.cr);
    EXPECT_EQ(frame.tei, 127);
    EXPECT_EQ(frame.information.size(), 5U);
    EXPECT_TRUE(frame.carriesTeiMessage());
    EXPECT_FALSE(frame.carriesMessage());
}

TEST(Layer2, TellsCommandsFromResponsesByTheSendersSide) {
    EXPECT_TRUE(isCommand(false, false));  // user, C/R 0
    EXPECT_FALSE(isCommand(true, false));  // user, C/R 1
    EXPECT_TRUE(isCommand(true, true));    // network, C/R 1
    EXPECT_FALSE(isCommand(false, true));  // network, C/R 0
}

TEST(Layer2, MarksWhatIsCutOrHasNoAddressOfTwoOctets) {
    for (const char* cut : {"", "02", "0201", "020101", "020100"}) {
        const auto octets = hex(cut);
        EXPECT_EQ(parseLayer2(octets).problem, Problem::truncated) << cut;
    }
    const auto oneOctet = hex("03 01 00 00");
    EXPECT_EQ(parseLayer2(oneOctet).problem, Problem::invalid);
    const auto endless = hex("00 00 00 00");
    EXPECT_EQ(parseLayer2(endless).problem, Problem::invalid);
}

// Q.921 figure 6: V(S) 5, V(R) 6, the rejected frame a response, W X Y Z = 0 1 0 1.
TEST(Layer2, ReadsTheInformationFieldOfFrameReject) {
    const auto octets = hex("0b 0c 0a 0d 0a");
    const FrameReject reject = parseFrameReject(octets);
    EXPECT_EQ(reject.rejectedControl[0], 0x0B);
    EXPECT_EQ(reject.rejectedControl[1], 0x0C);
    EXPECT_EQ(reject.vs, 5);
    EXPECT_EQ(reject.vr, 6);
    EXPECT_TRUE(reject.response);
    EXPECT_FALSE(reject.undefinedControl);
    EXPECT_TRUE(reject.informationNotPermitted);
    EXPECT_FALSE(reject.informationTooLong);
    EXPECT_TRUE(reject.invalidNr);
    EXPECT_EQ(reject.problem, Problem::none);
    EXPECT_EQ(parseFrameReject(Octets(octets).first(4)).problem, Problem::tooShort);
}

// Q.921 table 8: reference 4660, identity assigned, TEI 67 with its extension bit.
TEST(Layer2, ReadsAnIdentityAssignment) {
    const auto octets = hex("0f 12 34 02 87");
    const TeiMessage message = parseTeiMessage(octets);
    EXPECT_EQ(message.entity, 0x0F);
    EXPECT_EQ(message.reference, 0x1234);
    EXPECT_EQ(message.type, 2);
    EXPECT_EQ(teiMessageName(message.type), "identity assigned");
    EXPECT_EQ(message.action, 67);
    EXPECT_EQ(message.problem, Problem::none);
}

TEST(Layer2, ReadsEveryActionOfACheckResponse) {
    const auto octets = hex("0f 00 01 05 80 83");
    const TeiMessage message = parseTeiMessage(octets);
    ASSERT_EQ(message.actions.size(), 2U);
    EXPECT_EQ(message.actions[0] >> 1, 64);
    EXPECT_EQ(message.actions[1] >> 1, 65);
    EXPECT_EQ(message.problem, Problem::none);
    const auto tooLong = hex("0f 00 01 01 ff 00");
    EXPECT_EQ(parseTeiMessage(tooLong).problem, Problem::tooLong);
    EXPECT_EQ(parseTeiMessage(Octets(tooLong).first(4)).problem, Problem::tooShort);
}

}  // namespace
