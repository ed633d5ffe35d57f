#include "reader/report/Summary.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "calls/FindingKinds.h"
#include "isdn/Layer2.h"

namespace reader {

namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;

constexpr std::int64_t second = calls::second;

calls::Moment at(std::int64_t seconds) {
    return {.frame = 7, .clock = capture::Clock::relative, .time = seconds * second};
}

class Sentences : public testing::Test {
  protected:
    // A frame of the link of a TEI, after which the link is in this state.
    void link(calls::LinkState state, bool linkUp, std::int64_t seconds, std::uint8_t tei = 0) {
        const std::vector<std::uint8_t> octets{0x00, static_cast<std::uint8_t>(tei << 1 | 1), 0x73};
        calls::Marks marks;
        marks.state = state;
        marks.linkUp = linkUp;
        links.take("pri1", isdn::parseLayer2(octets), calls::Side::us, marks, at(seconds));
    }
    void call(calls::Side origin, calls::Outcome outcome) {
        calls::Call call;
        call.origin = origin;
        call.outcome = outcome;
        call.endedBy = calls::EndedBy::release;
        figures.gone(call);
    }
    std::vector<std::string> all() const {
        Overview overview{.frames = frames, .links = links, .figures = figures};
        overview.from = overview.until = {capture::Clock::relative, 0};
        overview.until.time = 90 * second;
        overview.findings = findings;
        overview.worst = worst;
        return summaryOf(overview);
    }

    std::uint64_t frames = 2;
    calls::LinkHistory links;
    calls::Figures figures;
    std::array<std::uint64_t, 3> findings{};
    std::optional<calls::Finding> worst;
};

TEST_F(Sentences, OfATraceInWhichNothingHappens) {
    EXPECT_THAT(all(), ElementsAre("The trace has 2 frames, from 0.000 to 90.000 seconds.",
                                   "There is no call whose beginning and result are in the trace.",
                                   "There are no findings."));
}

TEST_F(Sentences, OfATraceWithoutTimes) {
    const Overview overview{.frames = 1, .links = links, .figures = figures};
    EXPECT_EQ(summaryOf(overview).front(), "The trace has 1 frame, and no times.");
}

TEST_F(Sentences, SayAtLeastWhenTheSetUpWasNotSeen) {
    link(calls::LinkState::up, false, 12);
    EXPECT_THAT(all(), Contains("The link of pri1 has been up at least since 12.000."));
}

TEST_F(Sentences, SaySinceWhenTheSetUpWasSeenAndHowOftenItEnded) {
    link(calls::LinkState::up, true, 12);
    link(calls::LinkState::up, true, 20);
    EXPECT_THAT(all(), Contains("The link of pri1 has been up since 20.000; it went down 1 time."));
}

TEST_F(Sentences, SayThatALinkIsDownOrNeverCameUp) {
    link(calls::LinkState::down, false, 3);
    link(calls::LinkState::establishing, false, 4, 64);
    EXPECT_THAT(all(), Contains("The link of pri1 has been down since 3.000."));
    EXPECT_THAT(all(), Contains("The link of pri1, TEI 64, has not come up: its set-up waits for an answer "
                                "since 4.000."));
}

TEST_F(Sentences, CountTheLinksThatAreTooMany) {
    for (std::uint8_t tei = 64; tei < 75; ++tei)
        link(tei == 74 ? calls::LinkState::down : calls::LinkState::up, true, 1, tei);
    EXPECT_THAT(all(), Contains("Of 3 more links, 2 are up."));
}

TEST_F(Sentences, CountCallsAsTheFiguresDo) {
    call(calls::Side::us, calls::Outcome::answered);
    call(calls::Side::us, calls::Outcome::congestion);
    call(calls::Side::peer, calls::Outcome::busy);
    call(calls::Side::peer, calls::Outcome::open);
    EXPECT_THAT(all(), Contains("3 calls, 2 begun by us and 1 by the peer; 1 was answered, 1 failed."));
    EXPECT_THAT(all(), Contains("Besides, not counted: 1 call still being set up at its end."));
}

TEST_F(Sentences, NameTheWorstFindingAndWhatIsLost) {
    worst.emplace();
    worst->kind = &calls::findings::linkFlap;
    worst->severity = calls::Severity::error;
    worst->frame = 42;
    worst->clock = capture::Clock::relative;
    worst->time = 5 * second;
    worst->sentence = "set up\x1b again";
    findings = {2, 0, 1};
    links.note("pri1", calls::LinkNews::lost, at(1));
    EXPECT_THAT(all(), Contains("1 error, 0 warnings, 2 notes; the worst finding: error link-flap, "
                                "set up\\x1b again (frame 42, 5.000)."));
    EXPECT_THAT(all(), Contains("Frames may be missing: the input says so 1 time."));
}

}  // namespace

}  // namespace reader
