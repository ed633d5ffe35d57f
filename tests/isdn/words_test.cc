// Words of what is no element: whose user a location means, TEI messages, frame rejects, whole messages.
#include "isdn/words.h"

#include <gtest/gtest.h>

#include "tests/isdn/hex.h"

namespace {

using namespace isdn;
using isdn::testing::hex;

TEST(Words, TellWhichUserALocationMeans) {
    const auto octets = hex("08 02 80 91");
    const Element element = *Elements(octets).begin();
    const struct {
        Sender sender;
        const char* words;
    } rows[] = {
        {Sender::network, "cause 17 user busy, remote user"},
        {Sender::user, "cause 17 user busy, local user"},
        {Sender::unknown, "cause 17 user busy, user"},
    };
    for (const auto& row : rows) {
        std::string line;
        appendWords(line, element, Variant::net5, row.sender);
        EXPECT_EQ(line, row.words);
    }
}

TEST(Words, OfAMessageStandApartByTwoBlanks) {
    const auto octets = hex("08 01 05 05 a1 04 03 80 90 a3 96 18 01 89 9e 01 01 c2");
    std::string line = "SETUP ";
    appendWords(line, parseLayer3(octets), Variant::ess4);
    EXPECT_EQ(line, "SETUP SENDING COMPLETE  speech  element 6/18 89  ORIGINATING LINE INFORMATION");
}

// Identifier 01 of codeset 6, in a message of the discriminator 03.
TEST(Words, OfServiceTellTheNewStatus) {
    const auto octets = hex("03 02 00 00 0f 18 03 a9 83 81 96 01 01 c2");
    std::string line;
    appendWords(line, parseLayer3(octets), Variant::ni2);
    EXPECT_EQ(line, "channel 1!  channel out of service");
}

TEST(Words, MarkTheElementThatIsCut) {
    const auto octets = hex("08 01 05 05 a1 70 05 81 31");
    std::string line;
    appendWords(line, parseLayer3(octets), Variant::net5);
    EXPECT_EQ(line, "SENDING COMPLETE  called 1 unknown/ISDN (truncated)");
}

TEST(Words, OfTeiMessages) {
    const struct {
        const char* information;
        const char* words;
    } rows[] = {
        {"0f 12 34 01 ff", "identity request, Ri 4660, TEI any"},
        {"0f 12 34 02 87", "identity assigned, Ri 4660, TEI 67"},
        {"0f 00 01 05 80 83", "identity check response, Ri 1, TEI 64,65"},
        {"0f 00 01 09 83", "unknown TEI message, Ri 1, TEI 65"},
        {"0f 00", "unknown TEI message, Ri 0, TEI missing"},
    };
    for (const auto& row : rows) {
        const auto octets = hex(row.information);
        std::string line;
        appendWords(line, parseTeiMessage(octets));
        EXPECT_EQ(line, row.words);
    }
}

TEST(Words, OfFrameRejects) {
    const auto octets = hex("0b 0c 0a 0d 0a");
    std::string line;
    appendWords(line, parseFrameReject(octets));
    EXPECT_EQ(line,
              "rejected control 0b0c of a response, V(S) 5, V(R) 6, information not permitted, N(R) invalid");
    line.clear();
    appendWords(line, parseFrameReject(Octets(octets).first(2)));
    EXPECT_EQ(line, "rejected control 0b0c of a command, V(S) 0, V(R) 0 (too short)");
}

// Invoke 5 of the operation 34, charge in units during the call (EN 300 182-1), without an argument.
TEST(Words, OfAFacilityAreThoseOfItsComponents) {
    const auto octets = hex("1c 09 91 a1 06 02 01 05 02 01 22");
    std::string line;
    appendWords(line, *Elements(octets).begin(), Variant::net5);
    EXPECT_TRUE(line.starts_with("facility invoke 5 ")) << line;
}

}  // namespace
