// What LinkWatch waits for no longer when the recorder has missed frames or was started again, because it may
// have come unseen; and what it still knows.
#include <gtest/gtest.h>

#include <string>

#include "tests/calls/FoundOnLinks.h"

namespace {

using namespace calls;
using namespace calls::testing;

// The link is lost, and set up again at once.
std::string lostAndSetUp(int at) {
    const std::string time = std::to_string(at);
    return time + " < DM\n" + time + ".1 > SABME\n" + time + ".2 < UA\n";
}

TEST(FramesLost, EndTheWaitsForAnswers) {
    struct {
        const char *before, *after;
        const char* finds;
    } const cases[] = {
        {"10 > RR 0 P\n11 > RR 0 P\n12 > RR 0 P\n", "13 > RR 0 P\n", "warning frames-lost 5\n"},
        {"10 > RR 0 P\n10.5 < I 0 0\n11 > RR 1 P\n12 > RR 1 P\n", "13 > RR 1 P\n13.5 < I 1 0\n14 > RR 2\n",
         "warning frames-lost 6\n"},
        {"10 < DISC\n10.1 > UA\n11 > SABME\n12 > SABME\n13 > SABME\n", "14 > SABME\n",
         "warning frames-lost 7\n"},
    };
    for (const auto& each : cases) {
        Trunk trunk;
        trunk.tell(up).tell(each.before).missing().tell(each.after).advance(18);
        EXPECT_EQ(trunk.found(), each.finds) << each.before;
    }
}

// The frames that were missed may have acknowledged the first ones.
TEST(FramesLost, LetAFullWindowBeginAgain) {
    std::string story(up);
    for (int i = 0; i < 7; ++i)
        story += "1.0" + std::to_string(i) + " > I " + std::to_string(i) + " 0\n";
    EXPECT_EQ(Trunk().tell(story).missing().tell("1.9 > RR 0 P\n2.3 < RR 7 F\n").found(),
              "warning frames-lost 9\n");
}

TEST(FramesLost, MayHaveSaidThatAReceiverIsReadyAgain) {
    EXPECT_EQ(Trunk().tell(up).tell("1 < RNR 0\n").missing().tell("12 > RR 0 P\n12.1 < RR 0 F\n").found(),
              "warning frames-lost 3\n");
}

// The polls were missing before, but the numbers that would have told who had lost them are gone.
TEST(FramesLost, LeaveUndecidedWhyPollsWereMissing) {
    const std::string story = std::string(up) + idle(10, 60) + "100 > RR 0 P\n100.01 < RR 0 F\n";
    EXPECT_EQ(found(story), "warning keep-alive-missing 26\n");
    EXPECT_EQ(Trunk().tell(story).missing().tell(idle(110, 130)).found(), "warning frames-lost 28\n");
}

TEST(FramesLost, ChangeNothingInHowOftenTheSidesPoll) {
    EXPECT_EQ(Trunk().tell(up).tell(idle(10, 60)).missing().tell(idle(90, 120)).found(),
              "warning frames-lost 26\n");
    EXPECT_EQ(Trunk().tell(up).tell(idle(10, 60)).missing().tell(idle(70, 70)).advance(200).found(),
              "warning frames-lost 26\nwarning keep-alive-missing 30\n");
}

TEST(BoardRestarted, IsNoPartOfAFlap) {
    EXPECT_EQ(Trunk()
                  .tell(std::string(up) + lostAndSetUp(10) + lostAndSetUp(12) + "14 < DM\n")
                  .restarted()
                  .tell("15 > SABME\n15.1 < UA\n" + lostAndSetUp(16) + lostAndSetUp(18))
                  .found(),
              "note board-restarted 9\n");
}

TEST(BoardRestarted, EndsWhatAReleaseBeforeItHasExplained) {
    EXPECT_EQ(Trunk()
                  .tell(std::string(up) + "5 > DISC\n5.1 < UA\n")
                  .restarted()
                  .tell("6 > RR 0 P\n6.1 < RR 0 F\n" + lostAndSetUp(10) + lostAndSetUp(12) + lostAndSetUp(14))
                  .found(),
              "note board-restarted 4\nerror link-flap 15\n");
}

// A side that was silent before explains no SABME without an answer afterwards.
TEST(BoardRestarted, EndsWhatASilentDirectionHasExplained) {
    EXPECT_EQ(Trunk()
                  .tell(std::string(up) + "10 > RR 0 P\n11 > RR 0 P\n12 > RR 0 P\n13 > RR 0 P\n")
                  .advance(15)
                  .restarted()
                  .tell("20 > SABME\n21 > SABME\n22 > SABME\n23 > SABME\n")
                  .advance(25)
                  .found(),
              "error one-direction-silent 3\nnote board-restarted 6\nerror sabme-unanswered 7\n");
}

}  // namespace
