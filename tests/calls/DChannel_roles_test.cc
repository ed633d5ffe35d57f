// Which end of a link is the user, and which frames are commands.
#include <gtest/gtest.h>

#include "tests/calls/ToldChannel.h"

namespace {

using namespace calls;
using namespace calls::testing;

TEST_F(DChannelTest, TellsTheRoleOfTheOtherEnd) {
    EXPECT_EQ(told("0 > SABME\n0.01 < UA\n", true),
              "1 network command establishing\n2 network response link-up up\n");
}

TEST_F(DChannelTest, LearnsTheRoleFromAPollAndItsAnswer) {
    EXPECT_EQ(told("0 < RR 5 P\n0.01 > RR 7 F\n10 < RR 5 P\n10.01 > RR 7 F\n20 > RR 7 P\n"),
              "1 unknown\n"
              "2 user response up\n"
              "3 user command keep-alive up\n"
              "4 user response answers 3 up\n"
              "5 user command keep-alive up\n");
}

TEST_F(DChannelTest, LearnsNothingFromPollsThatAreFarApart) {
    EXPECT_EQ(told("0 < RR 5 P\n2 > RR 7 F\n"), "1 unknown\n2 up\n");
}

TEST_F(DChannelTest, UsesTheRoleThatOneLinkHasShownForTheOthers) {
    EXPECT_EQ(told("0 < sapi 63 UI = 0F 00 01 04 FF\n1 > tei 64 RR 0\n"),
              "1 user command accepted unknown\n2 user response unknown\n");
}

TEST(DChannelRole, IsNotQuestionedWhenItWasGiven) {
    DChannel channel({}, capture::Role::network);
    Told told(channel);
    EXPECT_EQ(told("0 > I 0 0\n"), "1 network response accepted unknown\n");
}

TEST_F(DChannelTest, SaysWhenAFrameContradictsTheRole) {
    EXPECT_EQ(told("0 > SABME\n0.01 < UA\n"), "1 user command establishing\n2 user response link-up up\n");
    EXPECT_EQ(told("1 > I 0 0\n", true), "3 user response accepted contradicts up [contradiction at 3]\n");
}

TEST_F(DChannelTest, SaysWhenBothSidesCodeCommandsAlike) {
    EXPECT_EQ(told("0 > SABME\n"), "1 user command establishing\n");
    EXPECT_EQ(told("0.5 < SABME\n", true), "2 user command establishing [same-role at 2]\n");
}

TEST_F(DChannelTest, LearnsNothingFromPollsThatCrossNorFromThoseOfOneSide) {
    EXPECT_EQ(told("0 > RR 0 P\n0.1 < RR 0 P\n"), "1 unknown\n2 up\n");
    DChannel another;
    EXPECT_EQ(Told(another)("0 < RR 5 P\n0.5 < RR 5 P\n"), "1 unknown\n2 unknown\n");
}

}  // namespace
