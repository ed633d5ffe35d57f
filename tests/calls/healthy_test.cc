// Links whose ends keep to the rules, for hours: nothing false may be said of them.
#include <gtest/gtest.h>

#include <array>
#include <map>
#include <string>

#include "calls/DChannel.h"
#include "calls/LinkFindings.h"
#include "tests/calls/TwoEnds.h"

namespace {

using namespace calls;
using calls::testing::frameOf;
using calls::testing::Habits;
using calls::testing::ScriptFrame;

class Counted : public FindingSink {
  public:
    void report(Finding finding) override { counts[std::string(finding.kind->id)] += finding.count; }
    std::map<std::string, unsigned> counts;
};

struct Outcome {
    std::map<std::string, unsigned> findings;
    unsigned information = 0, accepted = 0, frames = 0;
    bool inOrder = true;  // each side's messages were accepted in the order of their numbers
};

Outcome listen(const Habits& habits, std::int64_t duration, LinkFindings::Options options = {}) {
    Counted counted;
    Outcome outcome;
    DChannel channel;
    LinkFindings findings(std::move(options), counted);
    std::array<int, 2> next{0, 0};
    std::uint64_t number = 0;
    runTwoEnds(habits, duration, [&](const ScriptFrame& scripted) {
        const Marks& marks = channel.take(frameOf(scripted), ++number, scripted.at);
        findings.take(channel);
        const isdn::Layer2& frame = channel.layer2();
        if (frame.type != isdn::FrameType::I || !marks.accepted.value_or(false))
            return;
        int& expected = next[scripted.frame.transmitted ? 0 : 1];
        outcome.inOrder = outcome.inOrder && frame.ns == expected;
        expected = (expected + 1) % 128;
        ++outcome.accepted;
    });
    channel.finish();
    findings.finish(channel);
    outcome.frames = static_cast<unsigned>(number);
    outcome.findings = counted.counts;
    return outcome;
}

using Findings = std::map<std::string, unsigned>;

TEST(HealthyLink, IsSilentForADay) {
    const Outcome outcome = listen({}, 24 * 3600 * second);
    EXPECT_EQ(outcome.findings, Findings());
    EXPECT_TRUE(outcome.inOrder);
    EXPECT_GT(outcome.accepted, 40000U);
}

TEST(HealthyLink, IsSilentWhetherBusyOrIdle) {
    for (const std::int64_t between : {20 * millisecond, 200 * millisecond, 60 * second, 300 * second}) {
        Habits habits;
        habits.between = between;
        EXPECT_EQ(listen(habits, 900 * second).findings, Findings()) << between;
        habits.bothPoll = false;
        habits.idle = 30 * second;
        EXPECT_EQ(listen(habits, 900 * second).findings, Findings()) << between;
    }
}

TEST(HealthyLink, IsSilentOnBasicAccess) {
    Habits habits;
    habits.window = 1;
    habits.idle = 0;
    habits.between = 40 * second;
    EXPECT_EQ(listen(habits, 6 * 3600 * second, {.access = Access::basic}).findings, Findings());
}

TEST(NoisyLink, ShowsLostFramesAndNoOtherFault) {
    for (unsigned seed = 1; seed <= 3; ++seed) {
        Habits habits;
        habits.seed = seed;
        habits.lossesPerThousand = 2;
        habits.between = 300 * millisecond;
        Outcome outcome = listen(habits, 2 * 3600 * second);
        EXPECT_GT(outcome.findings["ns-gap-line"], 10U);
        outcome.findings.erase("ns-gap-line");
        EXPECT_EQ(outcome.findings, Findings()) << seed;
        EXPECT_TRUE(outcome.inOrder) << seed;
    }
}

TEST(NoisyLink, RepeatsTooOften) {
    Habits habits;
    habits.lossesPerThousand = 50;
    habits.between = 100 * millisecond;
    Outcome outcome = listen(habits, 2 * 3600 * second);
    EXPECT_EQ(outcome.findings["retransmissions"], 2U);
    EXPECT_GT(outcome.findings["ns-gap-line"], 1000U);
    EXPECT_EQ(outcome.findings["nr-invalid"] + outcome.findings["ns-gap-recorder"], 0U);
    EXPECT_TRUE(outcome.inOrder);
}

TEST(DeafRecorder, IsBlamedForWhatItMissed) {
    Habits habits;
    habits.missedPerThousand = 5;
    habits.between = 500 * millisecond;
    Outcome outcome = listen(habits, 3 * 3600 * second);
    EXPECT_GT(outcome.findings["ns-gap-recorder"], 100U);
    outcome.findings.erase("ns-gap-recorder");
    EXPECT_EQ(outcome.findings, Findings());
}

TEST(DeafRecorder, MissesAnswersOfPolls) {
    Habits habits;
    habits.missedPerThousand = 5;
    habits.between = 300 * second;
    Outcome outcome = listen(habits, 12 * 3600 * second);
    EXPECT_GT(outcome.findings["poll-unanswered"], 0U);
    outcome.findings.erase("poll-unanswered");
    outcome.findings.erase("ns-gap-recorder");
    EXPECT_EQ(outcome.findings, Findings());
}

}  // namespace
