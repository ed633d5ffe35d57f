#include "lapdlog/Prover.h"

#include <gtest/gtest.h>

#include "tests/lapdlog/logs.h"

namespace lapdlog {
namespace {

using namespace testing;
using capture::Variant;

// A frame's text without its time lines.
std::string bodyOf(bool transmitted, const Octets& octets, int swit = 7) {
    const std::string text = textOf(transmitted, 0, octets, swit);
    Header header;
    EXPECT_EQ(readHeader(text, header), Reading::good);
    return text.substr(header.size);
}

TEST(ProverTest, ATextIsProvedByItsDump) {
    Prover prover;
    for (const bool transmitted : {false, true}) {
        const std::string body = bodyOf(transmitted, setup);
        const Prover::Proof proof = prover.prove(body + "\nmore", transmitted, Variant::net5, false);
        EXPECT_EQ(proof.reading, Reading::good);
        EXPECT_EQ(proof.size, body.size());
        EXPECT_EQ(Octets(proof.octets.begin(), proof.octets.end()), setup);
        EXPECT_FALSE(proof.isDoubtful);
        EXPECT_EQ(prover.prove(body, !transmitted, Variant::net5, true).reading, Reading::bad);
        EXPECT_EQ(prover.prove(body, transmitted, Variant::ni2, true).reading, Reading::bad);
    }
}

TEST(ProverTest, TheBeginningOfATextIsCutWhileMoreMayComeAndBadAtTheEnd) {
    Prover prover;
    const std::string body = bodyOf(true, setup);
    for (std::size_t size = 0; size < body.size(); ++size) {
        EXPECT_EQ(prover.prove(body.substr(0, size), true, Variant::net5, false).reading, Reading::cut)
            << size;
        EXPECT_EQ(prover.prove(body.substr(0, size), true, Variant::net5, true).reading, Reading::bad)
            << size;
    }
}

TEST(ProverTest, ADumpOfWholeLinesIsDoubtfulAtTheEndOfTheText) {
    Prover prover;
    const std::string body = bodyOf(false, tenOctets);
    EXPECT_TRUE(prover.prove(body, false, Variant::net5, false).isDoubtful);
    EXPECT_FALSE(prover.prove(body + "\n", false, Variant::net5, false).isDoubtful);
}

TEST(ProverTest, SearchesForATitleOnlyWhereOneMayBe) {
    Prover prover;
    const std::string body = bodyOf(false, setup);
    const std::size_t title = body.find("Hex Dump: ");
    EXPECT_EQ(prover.prove(body, false, Variant::net5, true).untitled, title);
    EXPECT_EQ(prover.prove(body, false, Variant::net5, true, title).reading, Reading::good);
    EXPECT_EQ(prover.prove(body, false, Variant::net5, true, title + 1).reading, Reading::bad);
    // A title may be about to begin at the end of the text.
    EXPECT_EQ(prover.prove("TEI=0x00\nHex Dump:", false, Variant::net5, false).untitled, 8U);
}

}  // namespace
}  // namespace lapdlog
