#include "calls/HeldFindings.h"

#include <gtest/gtest.h>

#include <string>

#include "calls/FindingKinds.h"
#include "tests/calls/Findings.h"

namespace calls {

namespace {

using namespace test;

constexpr std::size_t us = 0, peer = 1;
constexpr std::int64_t messageAt = 1000 * millisecond;

// A finding that a message of the other side shows. While it is held, a frame of our side may be missing.
class HeldFindingsTest : public ::testing::Test {
  protected:
    HeldFindingsTest() { script.at(1000).peer(isdn::message::status, 1, true); }

    void report(HeldFindings& to) {
        Finding finding;
        finding.kind = &findings::statusIncompatible;
        finding.frame = 7;
        to.report(std::move(finding), script.toMessage(script.frames().front()));
    }
    void hold() {
        link.own.holeOpen[us] = true;
        report(held);
    }
    // A hole that turns out to be none.
    void close() { link.own.holeOpen[us] = false; }

    const std::string told = "7 status-incompatible\n";
    CallScript script;
    HealthyLink link;
    Found found;
    HeldFindings held{link, found};
};

class NoLink : public LinkWitnesses {
  public:
    const LinkWitness* witness(std::uint8_t) const override { return nullptr; }
};

}  // namespace

TEST_F(HeldFindingsTest, AreToldAtOnceIfNothingIsMissingBeforeTheMessage) {
    link.own.holeOpen[peer] = true;  // on the message's own side, which does not matter
    report(held);
    EXPECT_EQ(found.lines, told);
}

TEST_F(HeldFindingsTest, AreToldAtOnceIfNothingIsKnownOfTheLink) {
    const NoLink links;
    HeldFindings withoutLink(links, found);
    report(withoutLink);
    EXPECT_EQ(found.lines, told);
}

TEST_F(HeldFindingsTest, AreToldOnceWhenTheFrameComesThatWasMissing) {
    hold();
    held.advance();
    EXPECT_EQ(found.lines, "");
    close();
    held.advance();
    held.advance();
    EXPECT_EQ(found.lines, told);
}

TEST_F(HeldFindingsTest, AreDroppedForGoodWhenAFrameIsMissingOrTheLinkWasDownSince) {
    for (std::int64_t* const last : {&link.own.lastDown, &link.own.lastHole[us]}) {
        hold();
        close();
        *last = messageAt;
        held.advance();
        *last = LinkWitness::never;
        held.advance();
        EXPECT_EQ(found.lines, "");
    }
}

TEST_F(HeldFindingsTest, AreToldIfOnlyEarlierFramesOrThoseOfTheirOwnSideWereMissed) {
    hold();
    close();
    link.own.lastHole[us] = link.own.lastDown = messageAt - 1;
    link.own.lastHole[peer] = messageAt;
    held.advance();
    EXPECT_EQ(found.lines, told);
}

TEST_F(HeldFindingsTest, AreDroppedWhenTheBoardRestarts) {
    hold();
    held.forget();
    close();
    held.advance();
    EXPECT_EQ(found.lines, "");
}

TEST_F(HeldFindingsTest, AreBoundedInNumber) {
    for (int i = 0; i < 1000; ++i)
        hold();
    close();
    held.advance();
    EXPECT_LT(found.findings.size(), 1000U);
    EXPECT_GT(found.findings.size(), 0U);
}

}  // namespace calls
