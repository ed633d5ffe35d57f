// Findings that a frame shows: each in a story in which it must appear, and in one in which it must not.
#include "calls/LinkFindings.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/calls/FoundOnLinks.h"
#include "tests/calls/recorded.h"

namespace {

using namespace calls;
using namespace calls::testing;

TEST(LinkFindings, AreNoneOnAHealthyLink) {
    EXPECT_EQ(found(std::string(up) + idle(10, 200)), "");
    EXPECT_EQ(found(std::string(up) + "1 > I 0 0\n1.1 < RR 1\n1.2 < I 0 1\n1.3 > I 1 1\n1.4 < RR 2\n"), "");
}

TEST(LinkFindings, TellASentence) {
    Trunk trunk({.dChannel = "span 1"});
    trunk.tell("0 > SABME\n0.01 < DM F\n").found();
    ASSERT_EQ(trunk.findings().size(), 1U);
    const Finding& finding = trunk.findings().front();
    EXPECT_EQ(finding.sentence, "TEI 0: the other side answered SABME with DM");
    EXPECT_EQ(finding.dChannel, "span 1");
    EXPECT_EQ(finding.frame, 2U);
    EXPECT_EQ(finding.time, 10 * millisecond);
    EXPECT_EQ(finding.clock, capture::Clock::absolute);
}

TEST(LinkFindings, CountRepeatsWithinTenMinutes) {
    std::string story;
    for (int at = 0; at < 5; ++at)
        story += std::to_string(at) + " > SABME\n" + std::to_string(at) + ".01 < DM F\n";
    EXPECT_EQ(found(story), "warning link-refused 2\nwarning link-refused 10 x4\n");
    EXPECT_EQ(found("0 > SABME\n0.01 < DM F\n700 > SABME\n700.01 < DM F\n701 > SABME\n701.01 < DM F\n"),
              "warning link-refused 2\nwarning link-refused 4\nwarning link-refused 6\n");
}

TEST(LinkFindings, TellWhatWasOnlyCountedWhenTenMinutesHavePassedAndTheTraceGoesOn) {
    const std::string faults =
        "0 > SABME\n0.01 < DM F\n200 > SABME\n200.01 < DM F\n300 > SABME\n300.01 < DM F\n";
    const std::string first = "warning link-refused 2\n", counted = "warning link-refused 6 x2\n";
    Trunk trunk;
    trunk.tell(faults).advance(600);
    EXPECT_EQ(trunk.findings().size(), 1U);
    trunk.advance(601);
    EXPECT_EQ(trunk.findings().size(), 2U);
    EXPECT_EQ(trunk.found(), first + counted);
    EXPECT_EQ(Trunk().tell(faults).tell("601 > UI\n").found(), first + counted);
    // The next ten minutes begin when the counted ones are told.
    EXPECT_EQ(found(faults + "600 > SABME\n602 < DM F\n700 > SABME\n700.01 < DM F\n"),
              first + "warning link-refused 8 x3\nwarning link-refused 10\n");
    EXPECT_EQ(Trunk().tell(faults).advance(601).tell("1200 > SABME\n1200.01 < DM F\n").advance(1202).found(),
              first + counted + "warning link-refused 8\n");
}

TEST(FrameRejected, IsFoundWithWhatTheFrameSays) {
    Trunk trunk;
    trunk.tell(std::string(up) + "1 > I 0 0\n1.1 < FRMR = 00 00 00 02 08\n");
    EXPECT_EQ(trunk.found(), "error frame-rejected 4\n");
    EXPECT_TRUE(
        trunk.findings().front().sentence.starts_with("TEI 0: the other side rejected a frame: rejected"))
        << trunk.findings().front().sentence;
}

TEST(NsGap, BlamesTheLineAfterReject) {
    Trunk trunk;
    trunk.tell("1 < I 0 0\n1.1 < I 2 0\n1.2 > REJ 1\n1.3 < I 1 0\n1.4 < I 2 0\n1.5 > RR 3\n");
    EXPECT_EQ(trunk.found(), "warning ns-gap-line 2\n");
    EXPECT_EQ(trunk.findings().front().sentence,
              "TEI 0: of what the other side sent, 1 frame is missing from N(S) 1 on");
}

TEST(NsGap, BlamesTheRecorderWhenTheReceiverAcknowledges) {
    EXPECT_EQ(found("1 < I 0 0\n1.1 < I 3 0\n1.2 > RR 4\n"), "warning ns-gap-recorder 2\n");
}

TEST(NsGap, BlamesTheRecorderForFramesThatOurSideSent) {
    EXPECT_EQ(found("1 > I 0 0\n1.05 < RR 1\n1.1 > I 2 0\n1.2 < RR 3\n"), "warning ns-gap-recorder 3\n");
}

TEST(NsGap, BlamesNobodyWhenNoFrameExplainsIt) {
    EXPECT_EQ(found("1 > I 0 0\n1.05 < RR 1\n1.1 < I 0 1\n1.2 < I 2 1\n"), "note ns-gap-unknown 4\n");
}

TEST(NsGap, IsNotFoundWhereFramesAreRepeatedAfterReject) {
    // Our own frames, which the recorder has all seen.
    EXPECT_EQ(found(std::string(up) +
                    "1 > I 0 0\n1.01 > I 1 0\n1.02 > I 2 0\n1.1 < REJ 1\n1.2 > I 1 0\n1.3 > I 2 0\n"
                    "1.4 < RR 3\n"),
              "");
}

TEST(NrInvalid, IsFoundWhenTheSenderGoesOnBelowIt) {
    EXPECT_EQ(found("1 > I 0 0\n1.1 < RR 9\n2 > I 1 0\n"), "error nr-invalid 2\n");
    EXPECT_EQ(found("1 > I 0 0\n1.1 < RR 9\n2 > SABME\n2.1 < UA\n"),
              "error nr-invalid 2\nerror link-flap 3\n");
}

TEST(NrInvalid, IsNotFoundIfTheTraceEndsBeforeTheSenderGoesOn) {
    EXPECT_EQ(found("1 > I 0 0\n1.1 < RR 3\n11 > RR 0 P\n11.1 < RR 3 F\n"), "note ns-gap-unknown 2\n");
    EXPECT_EQ(found("1 > I 0 0\n1.05 < RR 1\n1.1 < I 0 1\n1.2 > RR 2\n"), "note ns-gap-unknown 4\n");
}

TEST(NrInvalid, IsNotFoundBehindALossOfTheRecorder) {
    EXPECT_EQ(Trunk()
                  .tell("1 > I 0 0\n1.05 < RR 1\n")
                  .missing()
                  .tell("1.1 < RR 9\n2 > I 9 0\n2.1 < RR 10\n")
                  .found(),
              "warning frames-lost 2\nwarning ns-gap-recorder 3\n");
}

TEST(BoardRestarted, ForgetsWaitsThatWereOpen) {
    EXPECT_EQ(
        Trunk().tell(std::string(up) + "1 > I 0 0\n").restarted().tell("0 > I 40 7\n0.1 < RR 41\n").found(),
        "note board-restarted 3\n");
}

TEST(BoardRestarted, AndFramesLostHaveTheTimeOfTheLastFrameBefore) {
    Trunk trunk;
    trunk.tell("5 > SABME\n5.01 < UA\n").missing().tell("7 > RR 0 P\n7.01 < RR 0 F\n").restarted();
    ASSERT_EQ(trunk.found(), "warning frames-lost 2\nnote board-restarted 4\n");
    EXPECT_EQ(trunk.findings().front().time, 5010 * millisecond);
    EXPECT_EQ(trunk.findings().back().time, 7010 * millisecond);
}

TEST(LinkFindings, LearnTheAccessFromTheChannelOfASetUp) {
    const auto accessAfter = [](const std::string& frame) {
        DChannel channel;
        Collected collected;
        LinkFindings findings({}, collected);
        std::uint64_t number = 0;
        const std::vector<ScriptFrame> frames = script("0 > SABME\n0.01 < UA\n1 < " + frame + "\n");
        for (const ScriptFrame& each : frames) {
            channel.take(frameOf(each), ++number, each.at);
            findings.take(channel);
        }
        return findings.access();
    };
    const std::string basic = "18 01 89", primary = "18 03 A9 83 81";
    EXPECT_EQ(accessAfter("I 0 0 = 08 02 00 01 05 " + primary), Access::primary);
    EXPECT_EQ(accessAfter("I 0 0 = 08 02 00 01 05 " + basic), Access::basic);
    EXPECT_EQ(accessAfter("UI = 08 01 01 05 " + basic), Access::basic);
    EXPECT_EQ(accessAfter("I 0 0 = 08 02 80 01 02 " + primary), Access::unknown);
}

TEST(DirectionAbsent, IsSaidOnce) {
    EXPECT_EQ(found("0 > RR 0 P\n10 > RR 0 P\n20 > RR 0 P\n30 > RR 0 P\n40 > RR 0 P\n60 > RR 0 P\n"),
              "note direction-absent 6\n");
}

TEST(SameRole, IsFoundWhenBothSidesAreUsers) {
    Trunk trunk;
    trunk.tell("0 > SABME\n").tell("0.5 < SABME\n", true).tell("1 > SABME\n").tell("1.5 < SABME\n", true);
    EXPECT_EQ(trunk.found(), "error same-role 2\n");
}

TEST(SameRole, IsNotFoundWhenSetUpsCross) {
    EXPECT_EQ(found("0 > SABME\n0.001 < SABME\n0.01 > UA\n0.011 < UA\n"), "");
}

TEST(LineLooped, IsFoundWhenTheFramesThatComeInAreThoseThatWentOut) {
    Trunk trunk;
    // What the other side sends has the octets of what ours has sent.
    for (int at = 0; at < 4; ++at)
        trunk.tell(std::to_string(at) + " > SABME\n").tell(std::to_string(at) + ".02 < SABME\n", true);
    // What the links show follows from that.
    trunk.tell("5 > UA\n").tell("5.02 < UA\n", true).tell("6 > SABME\n").tell("6.02 < SABME\n", true);
    EXPECT_EQ(trunk.found(), "error line-looped 6\n");
}

TEST(LineLooped, IsFoundOnALinkThatWasHealthyBefore) {
    Trunk trunk;
    trunk.tell(std::string(up) + idle(10, 30));
    for (int at = 40; at < 44; ++at)
        trunk.tell(std::to_string(at) + " > SABME\n").tell(std::to_string(at) + ".02 < SABME\n", true);
    EXPECT_NE(trunk.found().find("error line-looped 20\n"), std::string::npos);
}

TEST(LineLooped, IsNotFoundWherePollsAndAnswersAreTheSameOctets) {
    std::string story;
    for (int at = 10; at < 100; at += 10)
        story += std::to_string(at) + " > RR 0 P\n" + std::to_string(at) + ".01 < RR 0 F\n";
    EXPECT_EQ(found(story), "");
}

TEST(LineLooped, IsFoundByFramesThatAreNeitherPollsNorTheirAnswers) {
    for (const std::string frame : {"RR 0", "I 0 0 P"}) {
        Trunk trunk;
        trunk.tell(up);
        for (int at = 1; at < 4; ++at) {
            const std::string time = std::to_string(at);
            trunk.tell(time + " > " + frame + "\n").tell(time + ".02 < " + frame + "\n", true);
        }
        EXPECT_NE(trunk.found().find("error line-looped 8\n"), std::string::npos) << frame;
    }
}

TEST(LineLooped, IsNotFoundWhenCopiesComeLate) {
    Trunk trunk;
    for (int at = 0; at < 4; ++at)
        trunk.tell(std::to_string(at) + " > SABME\n").tell(std::to_string(at) + ".3 < SABME\n", true);
    EXPECT_EQ(trunk.found(), "error same-role 2\n");
}

TEST(RoleContradicted, IsFoundWhenOneSideChangesItsCoding) {
    EXPECT_EQ(Trunk().tell(std::string(up)).tell("1 > I 0 0\n", true).found(),
              "warning role-contradicted 3\n");
}

TEST(Tei, FindsDeniedAndRemovedTeis) {
    EXPECT_EQ(found("0 > sapi 63 UI = 0F 12 34 01 FF\n0.1 < sapi 63 UI = 0F 12 34 03 FF\n"),
              "warning tei-denied 2\n");
    EXPECT_EQ(found("0 < sapi 63 UI = 0F 00 00 06 81\n"), "note tei-removed 1\n");
}

TEST(Tei, IsDoubledWhenTwoTerminalsAnswerForIt) {
    const std::string check = "0 < sapi 63 UI = 0F 00 00 04 81\n0.1 > sapi 63 UI = 0F 11 11 05 81\n";
    EXPECT_EQ(found(check + "0.2 > sapi 63 UI = 0F 22 22 05 81\n"), "warning tei-doubled 3\n");
    EXPECT_EQ(found(check + "0.2 > sapi 63 UI = 0F 22 22 05 83\n"), "");
    EXPECT_EQ(found(check + "0.2 > sapi 63 UI = 0F 11 11 05 81\n"), "");
    EXPECT_EQ(found(check + "1.5 > sapi 63 UI = 0F 22 22 05 81\n"), "");
    EXPECT_EQ(found(check + "0.5 < sapi 63 UI = 0F 00 00 04 FF\n0.6 > sapi 63 UI = 0F 22 22 05 81\n"), "");
    EXPECT_EQ(found(check + "1.5 < sapi 63 UI = 0F 00 00 04 81\n1.6 > sapi 63 UI = 0F 22 22 05 81\n"), "");
}

TEST(Tei, IsDoubledWhenAnAnswerComesUnasked) {
    EXPECT_EQ(found(std::string(up) + "1 < UA\n"), "warning tei-doubled 3\n");
    EXPECT_EQ(found("1 < UA\n"), "");
    EXPECT_EQ(Trunk().tell(up).missing().tell("1 < UA\n").found(), "warning frames-lost 2\n");
}

TEST(Tei, IsNotedWhenAssignedOnAPrimaryRate) {
    const std::string story =
        "0 > sapi 63 UI = 0F 12 34 01 FF\n0.1 < sapi 63 UI = 0F 12 34 02 81\n"
        "1 > tei 64 SABME\n1.1 < tei 64 UA\n"
        "2 > tei 64 I 0 0 = 08 01 01 05 04 03 80 90 A3 18 ";
    EXPECT_EQ(found(story + "03 A9 83 81\n2.1 < tei 64 RR 1\n"), "note tei-assigned 2\n");
    EXPECT_EQ(found(story + "01 81\n2.1 < tei 64 RR 1\n"), "");
}

TEST(RecordedFrames, ShowNoErrorAndNoWarning) {
    EXPECT_EQ(Trunk().take(calls::testing::recordedFrames(calls::testing::europeanPrimary)).found(), "");
    EXPECT_EQ(Trunk().take(calls::testing::recordedFrames(calls::testing::northAmericanCall)).found(), "");
    // Six messages of as many links' beginnings.
    EXPECT_EQ(Trunk().take(calls::testing::recordedFrames(calls::testing::europeanReceived)).found(),
              "note ns-gap-recorder 2\nnote direction-absent 6\nnote ns-gap-recorder 6 x4\n");
    EXPECT_EQ(Trunk().take(calls::testing::recordedFrames(calls::testing::nationalBasic)).found(), "");
}

}  // namespace
