// Each finding about links: a story in which it must appear, and one in which it must not.
#include "calls/LinkFindings.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tests/calls/Script.h"
#include "tests/calls/recorded.h"

namespace {

using namespace calls;
using calls::testing::frameOf;
using calls::testing::script;
using calls::testing::ScriptFrame;

class Collected : public FindingSink {
  public:
    void report(Finding finding) override { findings.push_back(std::move(finding)); }
    std::vector<Finding> findings;
};

// A trunk whose frames are told as stories; says at its end what was found, a line a finding:
// "severity identifier frame", and " xN" for more than one.
class Trunk {
  public:
    explicit Trunk(LinkFindings::Options options = {}) : findings_(std::move(options), collected_) {}

    Trunk& tell(std::string_view story, bool network = false) { return take(script(story, network)); }
    Trunk& take(const std::vector<ScriptFrame>& frames) {
        for (const ScriptFrame& scripted : frames) {
            at_ = scripted.at;
            channel_.take(frameOf(scripted), ++number_, at_);
            findings_.take(channel_);
        }
        return *this;
    }
    Trunk& advance(std::int64_t seconds) {
        findings_.advance(seconds * second);
        return *this;
    }
    Trunk& missing() {
        channel_.mayMiss("Frames Lost");
        findings_.lost("Frames Lost: 3");
        return *this;
    }
    Trunk& restarted() {
        channel_.restarted();
        findings_.restarted();
        return *this;
    }
    std::string found() {
        channel_.finish();
        findings_.finish(channel_);
        std::string text;
        for (const Finding& finding : collected_.findings) {
            text.append(nameOf(finding.severity)).append(" ").append(finding.kind->id);
            text += " " + std::to_string(finding.frame);
            if (finding.count > 1)
                text += " x" + std::to_string(finding.count);
            text += "\n";
        }
        return text;
    }
    const std::vector<Finding>& findings() const { return collected_.findings; }

  private:
    Collected collected_;
    DChannel channel_;
    LinkFindings findings_;
    std::uint64_t number_ = 0;
    std::int64_t at_ = 0;
};

std::string found(std::string_view story, LinkFindings::Options options = {}) {
    return Trunk(std::move(options)).tell(story).found();
}

// Polls of both sides every ten seconds, from one moment to another.
std::string idle(int from, int to) {
    std::string story;
    for (int at = from; at <= to; at += 10) {
        const std::string time = std::to_string(at);
        story +=
            time + " > RR 0 P\n" + time + ".01 < RR 0 F\n" + time + ".5 < RR 0 P\n" + time + ".51 > RR 0 F\n";
    }
    return story;
}

constexpr std::string_view up = "0 > SABME\n0.01 < UA\n";

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

TEST(SabmeUnanswered, IsFoundWhenTheLastRepetitionHasNoAnswer) {
    EXPECT_EQ(Trunk().tell("0 > SABME\n1 > SABME\n2 > SABME\n3 > SABME\n").advance(5).found(),
              "error sabme-unanswered 1\nnote direction-absent 4\n");
    EXPECT_EQ(found("0 > SABME\n1 > SABME\n2 > SABME\n3 > SABME\n4 > SABME\n5.1 > SABME\n5.2 < UA\n"),
              "error sabme-unanswered 1\n");
}

TEST(SabmeUnanswered, IsNotFoundWhenARepetitionIsAnswered) {
    EXPECT_EQ(found("0 > SABME\n1 > SABME\n2 > SABME\n3 > SABME\n3.5 < UA\n5 > RR 0 P\n5.1 < RR 0 F\n"), "");
    EXPECT_EQ(Trunk().tell("0 > SABME\n1 > SABME\n2 > SABME\n").advance(100).found(), "");
}

TEST(LinkRefused, IsNotFoundOnAStandbyOfAGroup) {
    EXPECT_EQ(found("0 > SABME\n0.01 < DM F\n", {.grouped = true}), "");
    EXPECT_EQ(found("0 > SABME\n0.01 < DM F\n"), "warning link-refused 2\n");
}

TEST(LinkFlap, IsFoundWhenALinkIsSetUpAgainWithoutRelease) {
    EXPECT_EQ(found("0 > SABME\n0.01 < UA\n5 < SABME\n5.01 > UA\n"), "error link-flap 3\n");
    EXPECT_EQ(found("0 > RR 0 P\n0.01 < RR 0 F\n1 > I 0 0\n1.1 < RR 1\n5 > SABME\n5.1 < UA\n"),
              "error link-flap 5\n");
}

TEST(LinkFlap, IsFoundWhenALinkIsLostThreeTimesInAMinute) {
    std::string story(up);
    for (int at = 10; at <= 30; at += 10) {
        const std::string time = std::to_string(at);
        story += time + " < DM\n" + time + ".1 > SABME\n" + time + ".2 < UA\n";
    }
    EXPECT_EQ(found(story), "error link-flap 11\n");
}

TEST(LinkFlap, IsNotFoundBehindAReleaseOrOnFirstSetUp) {
    EXPECT_EQ(found("0 > SABME\n0.01 < UA\n5 > DISC\n5.01 < UA\n6 > SABME\n6.01 < UA\n7 < DISC\n7.1 > UA\n"
                    "8 > SABME\n8.1 < UA\n9 > DISC\n9.1 < UA\n10 > SABME\n10.1 < UA\n"),
              "");
    EXPECT_EQ(found("0 > SABME\n0.01 < SABME\n0.02 > UA\n0.03 < UA\n"), "");
}

TEST(LinkFlap, IsNotFoundOnBasicAccessNorOnAStandbyWithPollsOnly) {
    const std::string story = "0 > SABME\n0.01 < UA\n5 > SABME\n5.01 < UA\n";
    EXPECT_EQ(found(story, {.access = Access::basic}), "");
    EXPECT_EQ(found(story, {.grouped = true}), "");
    EXPECT_EQ(found("0 > SABME\n0.01 < UA\n1 > I 0 0\n1.1 < RR 1\n5 > SABME\n5.01 < UA\n", {.grouped = true}),
              "error link-flap 5\n");
}

TEST(LinkFlap, IsNotFoundWhenServiceHasTakenTheTrunkOut) {
    const auto afterService = [](const std::string& changeStatus) {
        return found(std::string(up) + "1 > I 0 0 = 03 01 00 0F 01 01 " + changeStatus +
                     "\n1.1 < RR 1\n5 > SABME\n5.01 < UA\n");
    };
    EXPECT_EQ(afterService("82"), "");
    EXPECT_EQ(afterService("80"), "error link-flap 5\n");
    EXPECT_EQ(afterService("C2"), "error link-flap 5\n");  // one channel is out of service
}

TEST(FrameRejected, IsFoundWithWhatTheFrameSays) {
    Trunk trunk;
    trunk.tell(std::string(up) + "1 > I 0 0\n1.1 < FRMR = 00 00 00 02 08\n");
    EXPECT_EQ(trunk.found(), "error frame-rejected 4\n");
    EXPECT_TRUE(
        trunk.findings().front().sentence.starts_with("TEI 0: the other side rejected a frame: rejected"))
        << trunk.findings().front().sentence;
}

TEST(NsGap, IsTheLinesAfterReject) {
    Trunk trunk;
    trunk.tell("1 < I 0 0\n1.1 < I 2 0\n1.2 > REJ 1\n1.3 < I 1 0\n1.4 < I 2 0\n1.5 > RR 3\n");
    EXPECT_EQ(trunk.found(), "warning ns-gap-line 2\n");
    EXPECT_EQ(trunk.findings().front().sentence,
              "TEI 0: of what the other side sent, 1 frame is missing from N(S) 1 on");
}

TEST(NsGap, IsTheRecordersWhenTheReceiverAcknowledges) {
    EXPECT_EQ(found("1 < I 0 0\n1.1 < I 3 0\n1.2 > RR 4\n"), "warning ns-gap-recorder 2\n");
}

TEST(NsGap, IsTheRecordersInWhatOurSideSent) {
    EXPECT_EQ(found("1 > I 0 0\n1.05 < RR 1\n1.1 > I 2 0\n1.2 < RR 3\n"), "warning ns-gap-recorder 3\n");
}

TEST(NsGap, IsUnknownWhenNobodySpeaksOfIt) {
    EXPECT_EQ(found("1 > I 0 0\n1.05 < RR 1\n1.1 < I 0 1\n1.2 < I 2 1\n"), "note ns-gap-unknown 4\n");
}

TEST(NsGap, IsNoneWhereFramesAreRepeatedAfterReject) {
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

TEST(NrInvalid, IsNotFoundBehindALossOfTheRecorder) {
    EXPECT_EQ(Trunk()
                  .tell("1 > I 0 0\n1.05 < RR 1\n")
                  .missing()
                  .tell("1.1 < RR 9\n2 > I 9 0\n2.1 < RR 10\n")
                  .found(),
              "warning frames-lost 2\nwarning ns-gap-recorder 3\n");
}

TEST(BoardRestarted, ForgetsWhatWasOpen) {
    EXPECT_EQ(
        Trunk().tell(std::string(up) + "1 > I 0 0\n").restarted().tell("0 > I 40 7\n0.1 < RR 41\n").found(),
        "note board-restarted 3\n");
}

TEST(Retransmissions, AreFoundAboveOneInAHundredWithinAnHour) {
    std::string often(up), seldom(up);
    for (int i = 0; i < 1500; ++i) {
        const std::string time = std::to_string(10 + i), number = std::to_string(i % 128);
        const std::string frame = time + " > I " + number + " 0\n";
        const std::string again = time + ".2 > I " + number + " 0\n";
        const std::string ack = time + ".3 < RR " + std::to_string((i + 1) % 128) + "\n";
        often += frame + (i % 40 == 0 ? again : "") + ack;
        seldom += frame + (i % 120 == 0 ? again : "") + ack;
    }
    EXPECT_EQ(found(often), "warning retransmissions 3001\n");
    EXPECT_EQ(found(seldom), "");
}

TEST(Retransmissions, AreNotFoundForOneRecovery) {
    std::string story(up);
    for (int i = 0; i < 12; ++i)
        story += "1." + std::to_string(10 + i) + " > I " + std::to_string(i) + " 0\n";
    story += "1.3 < REJ 0\n";
    for (int i = 0; i < 12; ++i)
        story += "1." + std::to_string(40 + i) + " > I " + std::to_string(i) + " 0\n";
    EXPECT_EQ(found(story + "1.6 < RR 12\n"), "");
}

TEST(KeepAliveMissing, IsFoundWhenPollsStop) {
    EXPECT_EQ(found(std::string(up) + idle(10, 60) + idle(100, 120)), "warning keep-alive-missing 26\n");
    EXPECT_EQ(Trunk().tell(std::string(up) + idle(10, 60)).advance(200).found(),
              "warning keep-alive-missing 26\n");
}

TEST(KeepAliveMissing, IsNotFoundWithinThreePeriodsOrWithoutPolls) {
    EXPECT_EQ(found(std::string(up) + idle(10, 60) + idle(90, 120)), "");
    EXPECT_EQ(Trunk().tell(std::string(up) + idle(10, 20)).advance(1000).found(), "");
    EXPECT_EQ(found(std::string(up) + "1 > I 0 0\n1.1 < RR 1\n500 > I 1 0\n500.1 < RR 2\n"), "");
    EXPECT_EQ(found(std::string(up) + idle(10, 60) + "61 > DISC\n61.1 < UA\n500 > SABME\n500.1 < UA\n"), "");
}

TEST(KeepAliveMissing, IsNotFoundOnBasicAccessNorWhereOneSidePollsSlowly) {
    EXPECT_EQ(found(std::string(up) + idle(10, 60) + idle(200, 220), {.access = Access::basic}), "");
    std::string slow(up);
    for (int at = 30; at <= 300; at += 30)
        slow += std::to_string(at) + " < RR 0 P\n" + std::to_string(at) + ".01 > RR 0 F\n";
    EXPECT_EQ(found(slow), "");
}

TEST(PollUnanswered, IsFoundAfterTheLastRepetition) {
    EXPECT_EQ(
        found(std::string(up) + "1 > RR 0 P\n2 > RR 0 P\n2.5 < I 0 0\n3 > RR 1 P\n4 > RR 1 P\n5.1 < I 1 0\n"),
        "warning poll-unanswered 3\n");
}

TEST(PollUnanswered, IsNotFoundBeforeTheLastRepetition) {
    EXPECT_EQ(Trunk()
                  .tell(std::string(up) + "1 > RR 0 P\n2 > RR 0 P\n2.5 < I 0 0\n3 > RR 1 P\n")
                  .advance(9)
                  .found(),
              "");
}

TEST(PollUnanswered, IsANoteWhenALaterPollIsAnswered) {
    EXPECT_EQ(found(std::string(up) + "10 > RR 0 P\n11 > RR 0 P\n11.1 < RR 0 F\n"),
              "note poll-unanswered 3\n");
}

TEST(PollUnanswered, IsNotFoundWhenASetUpOrReleaseEndsTheWait) {
    EXPECT_EQ(found(std::string(up) + "10 > RR 0 P\n10.1 < DISC\n10.2 > UA\n20 > SABME\n20.1 < UA\n"), "");
    EXPECT_EQ(found(std::string(up) + "10 > RR 0 P\n10.1 < DM\n20 > SABME\n20.1 < UA\n"), "");
}

TEST(WindowStalled, IsFoundWhenAFullWindowIsNotAcknowledgedInTime) {
    std::string story(up);
    for (int i = 0; i < 7; ++i)
        story += "1.0" + std::to_string(i) + " > I " + std::to_string(i) + " 0\n";
    EXPECT_EQ(found(story + "3 < RR 7\n"), "warning window-stalled 9\n");
    EXPECT_EQ(found(story + "1.5 < RR 7\n5 > I 7 0\n5.1 < RR 8\n"), "");
    EXPECT_EQ(found(story + "1.5 < RNR 0\n3 < RR 7\n"), "");
}

TEST(WindowStalled, IsNotFoundWhileAcknowledgementsComeOneByOne) {
    std::string story(up);
    for (int i = 0; i < 7; ++i)
        story += "1.0" + std::to_string(i) + " > I " + std::to_string(i) + " 0\n";
    for (int i = 0; i < 10; ++i) {
        const std::string time = "1." + std::to_string(i + 10);
        story += std::to_string(1.5 + i * 0.5) + " < RR " + std::to_string(i + 1) + "\n";
        story += std::to_string(1.6 + i * 0.5) + " > I " + std::to_string(i + 7) + " 0\n";
    }
    EXPECT_EQ(found(story), "");
}

TEST(WindowStalled, CountsOneFrameOnBasicAccess) {
    const std::string story = std::string(up) + "1 > I 0 0\n3 < RR 1\n";
    EXPECT_EQ(found(story, {.access = Access::basic}), "warning window-stalled 3\n");
    EXPECT_EQ(found(story), "");
}

TEST(ReceiverNotReady, IsFoundAfterTenSeconds) {
    EXPECT_EQ(found(std::string(up) + "1 < RNR 0\n5 < RNR 0\n12 < RR 0\n"), "warning receiver-not-ready 3\n");
    EXPECT_EQ(found(std::string(up) + "1 < RNR 0\n5 < RNR 0\n10 < RR 0\n12 > RR 0 P\n12.1 < RR 0 F\n"), "");
}

TEST(ReceiverNotReady, IsOverWhenTheLinkIsSetUpAgain) {
    EXPECT_EQ(found(std::string(up) + "1 < RNR 0\n2 > DISC\n2.1 < UA\n3 > SABME\n3.1 < UA\n"
                                      "20 > RR 0 P\n20.1 < RR 0 F\n"),
              "");
}

TEST(OneDirectionSilent, IsFoundWhenEveryDemandIsInVain) {
    EXPECT_EQ(found(std::string(up) + "10 > RR 0 P\n11 > RR 0 P\n12 > RR 0 P\n13 > RR 0 P\n"
                                      "14.1 > SABME\n15.1 > SABME\n16.1 > SABME\n17.1 > SABME\n20 > SABME\n"),
              "error one-direction-silent 3\nerror link-flap 7\n");
}

TEST(OneDirectionSilent, IsNotFoundForUiOrABurst) {
    std::string story(up);
    for (int i = 0; i < 9; ++i)
        story += std::to_string(i + 1) + " > UI = 08 01 01 05\n";
    EXPECT_EQ(found(story + "20 > RR 0 P\n20.1 < RR 0 F\n"), "");
    EXPECT_EQ(
        found(std::string(up) + "1 > I 0 0\n1.1 > I 1 0\n1.2 > I 2 0\n1.3 > I 3 0\n1.4 > I 4 0\n3 < RR 5\n"),
        "");
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

TEST(LineLooped, IsFoundWhenWhatComesInWentOut) {
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

TEST(Tei, FindsWhatManagementSays) {
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
