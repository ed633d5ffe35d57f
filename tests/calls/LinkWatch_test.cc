// Findings that time shows, or counting: each in a story in which it must appear, and in one in which it must
// not.
#include "calls/LinkWatch.h"

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>
#include <utility>

#include "tests/calls/FoundOnLinks.h"

namespace {

using namespace calls;
using namespace calls::testing;

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
    std::string story;
    for (int at = 10; at <= 30; at += 10) {
        const std::string time = std::to_string(at);
        story += time + " < DM\n" + time + ".1 > SABME\n" + time + ".2 < UA\n";
    }
    EXPECT_EQ(found(std::string(up) + story), "error link-flap 11\n");
    // A release earlier explains none of them.
    EXPECT_EQ(found(std::string(up) + "1 > DISC\n1.1 < UA\n2 > SABME\n2.1 < UA\n" + story),
              "error link-flap 15\n");
}

// Each poll that is on its way gets a DM of its own.
TEST(LinkFlap, IsFoundHoweverManyDmsTellOfEachLoss) {
    std::string story(up);
    for (int at = 10; at <= 30; at += 10) {
        const std::string time = std::to_string(at);
        story += time + " < DM\n" + time + ".05 < DM\n" + time + ".1 > SABME\n" + time + ".2 < UA\n";
    }
    EXPECT_EQ(found(story), "error link-flap 14\n");
}

TEST(LinkFlap, IsNotFoundForTwoLossesAndAFirstSetUpThatWasRefused) {
    std::string story = "1 > SABME\n1.1 < DM F\n2 > SABME\n2.1 < UA\n";
    for (const std::string time : {"10", "20"})
        story += time + " < DM\n" + time + ".1 > SABME\n" + time + ".2 < UA\n";
    EXPECT_EQ(found(story), "warning link-refused 2\n");
}

TEST(LinkFlap, IsNotFoundWhereALostLinkIsReleasedBeforeItIsSetUp) {
    std::string story(up);
    for (const std::string time : {"10", "20", "30"})
        story += time + " < DM\n" + time + ".1 > DISC\n" + time + ".2 < UA\n" + time + ".3 > SABME\n" + time +
                 ".4 < UA\n";
    EXPECT_EQ(found(story), "");
}

TEST(LinkFlap, IsCountedOnceForEachSetUp) {
    EXPECT_EQ(found(std::string(up) + "10 < DM\n10.1 > SABME\n10.2 < UA\n20 > SABME\n20.1 < UA\n"
                                      "30 > SABME\n30.1 < UA\n"),
              "error link-flap 6\nerror link-flap 8\n");
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

// Ten repetitions on three occasions are the least that is reported.
TEST(Retransmissions, AreFoundFromTenOnThreeOccasionsOn) {
    // The frames from `first` to `last` are sent once more, all together.
    const auto story = [](std::initializer_list<std::pair<int, int>> again) {
        std::string text(up);
        for (int i = 0; i < 60; ++i) {
            text += std::to_string(10 + i) + " > I " + std::to_string(i) + " 0\n";
            for (const auto& [first, last] : again) {
                for (int ns = first; i == last && ns <= last; ++ns)
                    text += std::to_string(10 + i) + ".2 > I " + std::to_string(ns) + " 0\n";
            }
        }
        return text + "70 < RR 60\n";
    };
    EXPECT_NE(found(story({{5, 8}, {20, 23}, {40, 41}})).find("warning retransmissions"), std::string::npos);
    EXPECT_EQ(found(story({{5, 8}, {20, 23}, {40, 40}})).find("retransmissions"), std::string::npos);
    EXPECT_EQ(found(story({{5, 10}, {20, 25}})).find("retransmissions"), std::string::npos);
}

// Polls and acknowledgements do not count, however many there are.
TEST(Retransmissions, AreComparedWithTheIFramesOfTheirSideAlone) {
    std::string story(up);
    for (int i = 0; i < 100; ++i) {
        const std::string time = std::to_string(10 + i), number = std::to_string(i);
        const std::string frame = time + " > I " + number + " 0\n";
        story += frame + (i % 10 == 0 ? frame : "") + time + ".1 < RR " + std::to_string(i + 1) + "\n";
        for (int poll = 2; poll < 10; ++poll)
            story += time + "." + std::to_string(poll) + " > RR 0 P\n" + time + "." + std::to_string(poll) +
                     "1 < RR " + std::to_string(i + 1) + " F\n";
    }
    EXPECT_NE(found(story).find("warning retransmissions"), std::string::npos);
}

TEST(Retransmissions, AreToldOfTheSideThatRepeatsWhenItsHourIsOver) {
    std::string story(up);
    for (int i = 0; i < 40; ++i) {
        const std::string frame = std::to_string(10 + i) + " < I " + std::to_string(i) + " 0\n";
        story += frame + (i % 4 == 0 ? frame : "");
        story += std::to_string(10 + i) + ".1 > RR " + std::to_string(i + 1) + "\n";
    }
    Trunk trunk;
    trunk.tell(story + "3610 < I 40 0\n");
    ASSERT_EQ(trunk.findings().size(), 1U);
    EXPECT_EQ(trunk.findings().front().sentence,
              "TEI 0: 10 of 50 I frames of the other side were sent again within an hour");
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

// The numbers show that the silence is the recorder's: frames of the link were sent meanwhile.
TEST(KeepAliveMissing, IsNotFoundWhereTheRecorderHasMissedFrames) {
    const std::string before = std::string(up) + "1 > I 0 0\n1.1 < RR 1\n" + idle(10, 60, 0, 1);
    EXPECT_EQ(found(before + "200 > RR 4\n201 < I 4 1\n201.1 > RR 5\n"), "warning ns-gap-recorder 30\n");
    EXPECT_EQ(found(before + "200 > I 9 0\n200.1 < RR 10\n"), "warning ns-gap-recorder 29\n");
    EXPECT_EQ(found(before + "200 > I 1 0\n200.1 < RR 2\n201 > I 4 0\n"), "warning ns-gap-recorder 31\n");
    EXPECT_EQ(found(before + "200 > I 0 0 = 08 01 07 05\n"), "note ns-gap-recorder 29\n");
}

TEST(KeepAliveMissing, IsFoundWhereTheNumbersGoOnAfterTheSilence) {
    const std::string before = std::string(up) + "1 > I 0 0\n1.1 < RR 1\n" + idle(10, 60, 0, 1);
    EXPECT_EQ(found(before + "200 > I 1 0\n200.1 < RR 2\n"), "warning keep-alive-missing 28\n");
    EXPECT_EQ(found(before + "200 > SABME\n200.1 < UA\n201 > I 9 0\n"),
              "warning keep-alive-missing 28\nerror link-flap 29\nwarning ns-gap-recorder 31\n");
    EXPECT_EQ(found(before + "200 > I 1 0\n200.1 < RR 2\n205 > RR 0 P\n205.1 < RR 2 F\n"
                             "211 > I 2 0\n211.1 < RR 3\n212 > I 9 0\n"),
              "warning keep-alive-missing 28\nwarning ns-gap-recorder 35\n");
}

TEST(KeepAliveMissing, IsFoundEachTimeThatPollsStop) {
    for (const bool ours : {false, true}) {
        std::string story(up);
        for (const int at : {10, 20, 30, 70, 80, 90, 130, 140, 150, 190}) {
            const std::string time = std::to_string(at);
            story +=
                time + (ours ? " >" : " <") + " RR 0 P\n" + time + ".01" + (ours ? " <" : " >") + " RR 0 F\n";
        }
        EXPECT_EQ(found(story), "warning keep-alive-missing 8\nwarning keep-alive-missing 20 x2\n") << ours;
    }
}

// From the third long interval on, the longer period is the period.
TEST(KeepAliveMissing, IsNotFoundForEverWhereASideBeginsToPollLessOften) {
    std::string story = std::string(up) + idle(10, 60);
    for (int at = 100; at <= 900; at += 40)
        story += idle(at, at);
    EXPECT_EQ(found(story), "warning keep-alive-missing 26\nwarning keep-alive-missing 30\n");
}

TEST(KeepAliveMissing, IsSaidBeforeTheNextFrameComes) {
    Trunk trunk;
    trunk.tell(std::string(up) + idle(10, 60)).advance(91);
    EXPECT_EQ(trunk.advance(92).findings().size(), 1U);
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

TEST(PollUnanswered, IsANoteWhenTheNextPollIsAnswered) {
    EXPECT_EQ(found(std::string(up) + "10 > RR 0 P\n11 > RR 0 P\n11.1 < RR 0 F\n"),
              "note poll-unanswered 3\n");
    EXPECT_EQ(found(std::string(up) + "10 > RR 0 P\n20 > RR 0 P\n20.1 < RR 0 F\n"),
              "note poll-unanswered 3\n");
    EXPECT_EQ(found(std::string(up) + "10 > RR 0 P\n10.1 < RR 0 F\n20 > RR 0 P\n20.1 < RR 0 F\n"), "");
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

TEST(WindowStalled, IsFoundThoughOtherFramesPassMeanwhile) {
    std::string story(up);
    for (int i = 0; i < 7; ++i)
        story += "1.0" + std::to_string(i) + " > I " + std::to_string(i) + " 0\n";
    EXPECT_EQ(found(story + "1.5 < RR 0 P\n1.51 > RR 0 F\n2 < RR 0 P\n2.01 > RR 0 F\n2.5 < RR 7\n"),
              "warning window-stalled 9\n");
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

}  // namespace
