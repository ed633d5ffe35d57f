#include "calls/DChannel.h"

#include <gtest/gtest.h>

#include <sstream>

#include "tests/calls/Script.h"
#include "tests/calls/ToldChannel.h"
#include "tests/calls/recorded.h"

namespace {

using namespace calls;
using namespace calls::testing;

TEST_F(DChannelTest, FollowsALinkFromSetUpToRelease) {
    EXPECT_EQ(told("0 > SABME\n"
                   "0.01 < UA\n"
                   "1 > I 0 0\n"
                   "1.01 < RR 1\n"
                   "2 < I 0 1\n"
                   "2.01 > RR 1\n"
                   "3 > DISC\n"
                   "3.01 < UA\n"),
              "1 user command establishing\n"
              "2 user response link-up up\n"
              "3 user command accepted up\n"
              "4 user response up\n"
              "5 user command accepted up\n"
              "6 user response up\n"
              "7 user command releasing\n"
              "8 user response link-down down\n");
    EXPECT_TRUE(channel.find(0, 0) != nullptr);
    EXPECT_TRUE(channel.find(0, 1) == nullptr);
    EXPECT_EQ(told.atEnd(), "");
}

TEST_F(DChannelTest, TakesCrossingSetUpsForOne) {
    EXPECT_EQ(
        told("0 > SABME\n0.01 < SABME\n0.02 < UA\n0.03 > I 0 0\n0.04 > UA\n0.05 > I 1 0\n0.06 < RR 2\n"),
        "1 user command establishing\n"
        "2 user command establishing\n"
        "3 user response link-up up\n"
        "4 user command accepted up\n"
        "5 user response up\n"
        "6 user command accepted up\n"
        "7 user response up\n");
}

// The UA that answers SABME leaves no answer to an earlier DISC due.
TEST_F(DChannelTest, WaitsForNoAnswerToADiscThatASetUpFollows) {
    EXPECT_EQ(told("0 > DISC\n0.5 > SABME\n0.51 < UA\n0.52 < UA\n"),
              "1 user command releasing\n"
              "2 user command establishing\n"
              "3 user response link-up up\n"
              "4 user response up [unsolicited-answer at 4]\n");
}

TEST_F(DChannelTest, SaysThatASetUpWasRefused) {
    EXPECT_EQ(told("0 > SABME\n0.01 < DM F\n"),
              "1 user command establishing\n2 user response link-down down [refused at 2]\n");
}

TEST_F(DChannelTest, SaysThatALinkIsSetUpAgainWhileItIsUp) {
    EXPECT_EQ(told("0 > SABME\n0.01 < UA\n5 > SABME\n5.01 < UA\n"),
              "1 user command establishing\n"
              "2 user response link-up up\n"
              "3 user command link-down establishing [set-up-again at 3]\n"
              "4 user response link-up up\n");
}

TEST_F(DChannelTest, DoesNotPassOnFramesThatArriveBeforeTheLinkIsUp) {
    EXPECT_EQ(told("0 > SABME\n0.005 < I 9 9\n0.01 < UA\n0.02 < I 0 0\n"),
              "1 user command establishing\n"
              "2 user command refused establishing\n"
              "3 user response link-up up\n"
              "4 user command accepted up\n");
}

TEST_F(DChannelTest, KnowsThatALinkIsUpAlthoughTheAnswerToSabmeIsMissing) {
    EXPECT_EQ(told("0 > SABME\n1 > I 0 0\n1.1 < RR 1\n"),
              "1 user command establishing\n"
              "2 user command accepted up\n"
              "3 user response up\n");
}

TEST_F(DChannelTest, MarksAPollAfterOneThatWasNotAnswered) {
    EXPECT_EQ(told("0 > I 0 0\n0.1 < RR 1\n20 > RR 0 P\n21 > RR 0 P\n21.01 < RR 1 F\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command keep-alive up\n"
              "4 user command poll-unanswered up\n"
              "5 user response up\n");
}

TEST_F(DChannelTest, HidesNoKeepAliveNearAnEvent) {
    EXPECT_EQ(told("0 > SABME\n0.01 < UA\n"
                   "9 > RR 0 P\n9.01 < RR 0 F\n"
                   "19 > RR 0 P\n19.01 < RR 0 F\n"
                   "29 > RR 0 P\n30.5 < RR 0 F\n"
                   "39 > RR 0 P\n39.005 > I 0 0\n39.01 < RR 1 F\n"
                   "49 > RNR 0 P\n49.01 < RR 1 F\n"
                   "59 > RR 0 P\n59.01 < RR 1 F\n"
                   "69 > RR 0 P\n69.01 < RR 1 F\n"),
              "1 user command establishing\n"
              "2 user response link-up up\n"
              "3 user command up\n"
              "4 user response up\n"
              "5 user command keep-alive up\n"
              "6 user response answers 5 up\n"
              "7 user command keep-alive up\n"
              "8 user response up\n"
              "9 user command keep-alive up\n"
              "10 user command accepted up\n"
              "11 user response up\n"
              "12 user command up\n"
              "13 user response up\n"
              "14 user command up\n"
              "15 user response up\n"
              "16 user command keep-alive up\n"
              "17 user response answers 16 up\n");
}

TEST_F(DChannelTest, ForgetsTheLinksWhenTheRecorderIsStartedAgain) {
    told("0 > SABME\n0.01 < UA\n1 > I 0 0\n");
    channel.restarted();
    EXPECT_EQ(told("0 > I 9 3\n0.1 < RR 10\n"), "4 user command accepted unknown\n5 user response up\n");
}

TEST_F(DChannelTest, HidesNoKeepAliveWithAFrameBetweenPollAndAnswer) {
    EXPECT_EQ(told("0 > I 0 0\n0.1 < RR 1\n20 > RR 0 P\n20.01 < I 0 1\n20.02 < RR 1 F\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command keep-alive up\n"
              "4 user command accepted up\n"
              "5 user response up\n");
}

TEST_F(DChannelTest, WaitsForNoAnswerBehindDisconnectedMode) {
    EXPECT_EQ(told("0 > I 0 0\n0.1 < RR 1\n20 > RR 0 P\n20.1 < DM\n30 > RR 0 P\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command keep-alive up\n"
              "4 user response link-down down\n"
              "5 user command down\n");
}

// Each excerpt on a D channel of its own: what is accepted, and what happens besides.
std::string toldOf(std::string_view excerpt) {
    DChannel channel;
    std::string text;
    std::uint64_t number = 0;
    for (const ScriptFrame& recorded : calls::testing::recordedFrames(excerpt)) {
        const Marks& marks = channel.take(frameOf(recorded), ++number, recorded.at);
        if (marks.accepted.value_or(false))
            text += " " + std::to_string(number);
        for (const LinkEvent& event : channel.events())
            text += wordsOf(event);
    }
    channel.finish();
    for (const LinkEvent& event : channel.events())
        text += wordsOf(event);
    return text + (channel.role() == capture::Role::user ? " user" : " not the user");
}

TEST(RecordedFrames, AreAcceptedAndHealthy) {
    EXPECT_EQ(toldOf(calls::testing::europeanPrimary), " 1 3 5 7 8 user");
    EXPECT_EQ(toldOf(calls::testing::northAmericanCall), " 5 7 9 11 13 15 17 19 user");
    EXPECT_EQ(toldOf(calls::testing::europeanReceived),
              " 1 2 [unseen-set-up at 2] 3 [unseen-set-up at 3] 4 [unseen-set-up at 4] 5 [unseen-set-up at 5]"
              " 6 [unseen-set-up at 6] user");
    EXPECT_EQ(toldOf(calls::testing::nationalBasic), " 3 4 5 6 user");
}

TEST_F(DChannelTest, TakesAnyOctets) {
    const std::vector<std::uint8_t> octets{0x00, 0x01};
    for (std::size_t length = 0; length <= octets.size(); ++length) {
        capture::Frame frame;
        frame.octets = std::span(octets).first(length);
        const Marks& marks = channel.take(frame, 1, 0);
        EXPECT_FALSE(marks.accepted.has_value());
        EXPECT_EQ(channel.link(), nullptr);
    }
}

}  // namespace
