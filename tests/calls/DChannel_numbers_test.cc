// Sequence numbers: repeated frames, holes and who lost them, acknowledgements.
#include <gtest/gtest.h>

#include <sstream>

#include "tests/calls/Script.h"
#include "tests/calls/ToldChannel.h"

namespace {

using namespace calls;
using namespace calls::testing;

TEST_F(DChannelTest, DoesNotPassARepeatedFrameOn) {
    EXPECT_EQ(told("0 > SABME\n0.01 < UA\n"
                   "1 > I 0 0\n"
                   "2 > I 0 0\n"
                   "2.1 < RR 1\n"
                   "3 > I 1 0\n"),
              "1 user command establishing\n"
              "2 user response link-up up\n"
              "3 user command accepted up\n"
              "4 user command refused again up\n"
              "5 user response up\n"
              "6 user command accepted up\n");
}

TEST_F(DChannelTest, BlamesTheLineForAHoleThatIsSentAgainAfterReject) {
    EXPECT_EQ(told("0 > SABME\n0.01 < UA\n"
                   "1 < I 0 0\n"
                   "1.1 < I 2 0\n"
                   "1.2 < I 3 0\n"
                   "1.3 > REJ 1\n"
                   "1.4 < I 4 0\n"
                   "1.5 < I 1 0\n"
                   "1.6 < I 2 0\n"
                   "1.7 > RR 3\n"),
              "1 user command establishing\n"
              "2 user response link-up up\n"
              "3 user command accepted up\n"
              "4 user command early up\n"
              "5 user command early up\n"
              "6 user response up [hole at 4: 1 from 1 by line]\n"
              "7 user command refused early up\n"
              "8 user command accepted again up\n"
              "9 user command accepted again up\n"
              "10 user response up\n");
    EXPECT_EQ(told.atEnd(), "");
}

TEST_F(DChannelTest, BlamesTheLineForAHoleThatIsSentAgainByItself) {
    EXPECT_EQ(told("1 < I 0 0\n1.1 < I 2 0\n2.2 < I 1 0\n2.3 < I 2 0\n"),
              "1 user command accepted unknown\n"
              "2 user command early unknown\n"
              "3 user command accepted again unknown [hole at 2: 1 from 1 by line]\n"
              "4 user command accepted again unknown\n");
}

TEST_F(DChannelTest, BlamesTheRecorderForAHoleThatTheReceiverAcknowledges) {
    EXPECT_EQ(told("1 < I 0 0\n1.05 > RR 1\n1.1 < I 2 0\n1.2 < I 3 0\n1.3 > RR 3\n1.4 < I 4 0\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command early up\n"
              "4 user command early up\n"
              "5 late 3 late 4 user response up [hole at 3: 1 from 1 by recorder]\n"
              "6 user command accepted up\n");
    EXPECT_EQ(told.atEnd(), "");
}

TEST_F(DChannelTest, DoesNotDecideAboutAHoleThatNoFrameExplains) {
    EXPECT_EQ(told("1 < I 0 0\n1.1 < I 2 0\n"),
              "1 user command accepted unknown\n2 user command early unknown\n");
    EXPECT_EQ(told.atEnd(), " [hole at 2: 1 from 1 by unknown]");
}

TEST_F(DChannelTest, BlamesTheRecorderForAHoleInWhatOurSideSent) {
    EXPECT_EQ(told("1 > I 0 0\n1.1 > I 3 0\n1.2 < RR 4\n"),
              "1 user command accepted unknown\n"
              "2 user command accepted early unknown [hole at 2: 2 from 1 by recorder]\n"
              "3 user response up\n");
}

TEST_F(DChannelTest, TakesWhatTheRecorderSaysForTheReasonOfAHole) {
    EXPECT_EQ(told("1 < I 0 0\n"), "1 user command accepted unknown\n");
    channel.mayMiss("Frames Lost");
    EXPECT_EQ(told("1.1 < I 4 0\n1.2 < I 5 0\n"),
              "2 user command accepted early unknown [hole at 2: 3 from 1 by recorder]\n"
              "3 user command accepted unknown\n");
}

TEST_F(DChannelTest, KnowsFromAnAcknowledgementAloneWhatTheRecorderHasMissed) {
    told("1 > RR 3\n");
    channel.mayMiss("Frames Lost");
    const std::string said = told("3 < I 5 0\n");
    EXPECT_NE(said.find("[hole at 2: 2 from 3 by recorder]"), std::string::npos) << said;
}

TEST_F(DChannelTest, CountsAFrameWithoutOctetsForOneNumber) {
    EXPECT_EQ(told("1 < I 0 0\n"), "1 user command accepted unknown\n");
    channel.mayLack(Side::peer);
    EXPECT_EQ(told("1.1 < I 2 0\n"), "2 user command accepted early unknown\n");
    channel.mayLack(Side::peer);
    EXPECT_EQ(told("1.2 < I 5 0\n"),
              "3 user command accepted early unknown [hole at 3: 2 from 3 by recorder]\n");
}

TEST_F(DChannelTest, FindsAnAcknowledgementOfWhatWasNotSent) {
    EXPECT_EQ(told("1 > I 0 0\n1.1 < RR 3\n2 > I 1 0\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command accepted up [nr-invalid at 2: 3]\n");
}

TEST_F(DChannelTest, TakesAnAcknowledgementOfWhatTheTraceLacksForAGapOfTheRecorder) {
    EXPECT_EQ(told("1 > I 0 0\n1.1 < RR 3\n2 > I 3 0\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command accepted early up [hole at 3: 2 from 1 by recorder]\n");
    EXPECT_EQ(told.atEnd(), "");
    EXPECT_EQ(told("3 < I 0 4\n3.1 > RR 2\n4 < I 2 4\n"),
              "4 user command accepted up\n"
              "5 user response up\n"
              "6 user command accepted early up [hole at 6: 1 from 1 by recorder]\n");
}

TEST_F(DChannelTest, AllowsAnAcknowledgementThatStandsJustBeforeItsFrame) {
    EXPECT_EQ(told("1 > I 0 0\n1.004 < RR 2\n1.008 > I 1 0\n"),
              "1 user command accepted unknown\n2 user response up\n3 user command accepted up\n");
    EXPECT_EQ(told.atEnd(), "");
}

TEST_F(DChannelTest, SeesThatNumbersBeginAgainWithoutSetUp) {
    EXPECT_EQ(told("1 > I 5 5\n1.1 < RR 6\n"
                   "9 > I 0 0 = 08 01 02 05\n"
                   "9.1 < RR 1\n"
                   "10 > I 0 0 = 08 01 02 05\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command accepted unseen-set-up up [unseen-set-up at 3]\n"
              "4 user response up\n"
              "5 user command refused again up\n");
}

TEST_F(DChannelTest, CountsBeyond127WithoutAnEvent) {
    std::string story;
    for (int i = 100; i < 300; ++i) {
        const std::string at = std::to_string(i);
        story += at + " > I " + std::to_string(i % 128) + " 0\n" + at + ".01 < RR " +
                 std::to_string((i + 1) % 128) + "\n";
    }
    const std::string text = told(story);
    EXPECT_EQ(text.find('['), std::string::npos) << text;
    EXPECT_EQ(text.find("refused"), std::string::npos) << text;
}

TEST_F(DChannelTest, PassesAWaitingFrameOnOnceThoughItWasRepeated) {
    EXPECT_EQ(told("1 < I 0 0\n1.1 < I 2 0\n2.1 < I 2 0\n2.2 > RR 3\n"),
              "1 user command accepted unknown\n"
              "2 user command early unknown\n"
              "3 user command again early unknown\n"
              "4 late 2 user response up [hole at 2: 1 from 1 by recorder]\n");
}

TEST_F(DChannelTest, WaitsOnWhileTheReceiverHasAcknowledgedNothing) {
    EXPECT_EQ(told("1 < I 0 0\n1.1 < I 2 0\n1.15 > RR 1\n1.2 > RR 3\n"),
              "1 user command accepted unknown\n"
              "2 user command early unknown\n"
              "3 user response up\n"
              "4 late 2 user response up [hole at 2: 1 from 1 by recorder]\n");
}

TEST_F(DChannelTest, TakesNoOldFrameForABeginning) {
    EXPECT_EQ(told("1 > I 5 5\n1.1 < RR 6\n9 > I 0 5 = 08 01 02 05\n"),
              "1 user command accepted unknown\n2 user response up\n3 user command refused again up\n");
}

TEST_F(DChannelTest, TakesNumbersAsTheyComeOnALinkThatCameUpUnseen) {
    EXPECT_EQ(told("0 > I 0 0\n0.1 < RR 1\n2 > DISC\n2.1 < UA\n5 > I 40 7\n5.1 < RR 41\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command releasing\n"
              "4 user response link-down down\n"
              "5 user command accepted up\n"
              "6 user response up\n");
}

TEST_F(DChannelTest, BlamesTheRecorderForMoreThanTheLineCanLose) {
    EXPECT_EQ(told("1 < I 100 0\n1.1 > RR 101\n9 < I 10 0\n9.1 > RR 11\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command accepted early up [hole at 3: 37 from 101 by recorder]\n"
              "4 user response up\n");
    EXPECT_EQ(told.atEnd(), "");
}

TEST_F(DChannelTest, GoesOnAfterMoreThanHalfOfAllNumbersAreMissing) {
    EXPECT_EQ(told("1 < I 100 0\n1.1 > RR 101\n9 < I 40 0\n9.1 > RR 41\n10 < I 41 0\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command accepted early up [hole at 3: 67 from 101 by recorder]\n"
              "4 user response up\n"
              "5 user command accepted up\n");
    EXPECT_EQ(told.atEnd(), "");
}

TEST_F(DChannelTest, CountsAHoleThatIsOpenWithTheManyNumbersMissingBehindIt) {
    EXPECT_EQ(told("1 < I 100 0\n1.1 > RR 101\n1.2 < I 102 0\n9 < I 40 0\n9.1 > RR 41\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command early up\n"
              "4 user command accepted early up [hole at 4: 67 from 101 by recorder]\n"
              "5 user response up\n");
    EXPECT_EQ(told.atEnd(), "");
}

TEST_F(DChannelTest, ComparesARepetitionWithNothingFromBeforeManyMissingNumbers) {
    std::string story;
    for (int i = 30; i <= 100; ++i)
        story += "1 > I " + std::to_string(i) + " 0 = 08 01 01 05\n1 < RR " + std::to_string(i + 1) + "\n";
    told(story);
    EXPECT_EQ(told("9 > I 40 0 = 08 01 02 05\n9.1 > I 39 0 = 08 01 02 05\n"),
              "143 user command accepted early up [hole at 143: 67 from 101 by recorder]\n"
              "144 user command refused again up\n");
}

TEST_F(DChannelTest, GoesOnWhenANumberComesAgainWithAnotherText) {
    EXPECT_EQ(told("1 < I 4 0 = 08 01 01 05\n1.1 < I 5 0\n1.2 > RR 6\n"
                   "9 < I 4 0 = 08 01 02 05\n9.1 > RR 5\n10 < I 4 0 = 08 01 02 05\n"),
              "1 user command accepted unknown\n"
              "2 user command accepted unknown\n"
              "3 user response up\n"
              "4 user command accepted early up [hole at 4: 126 from 6 by recorder]\n"
              "5 user response up\n"
              "6 user command refused again up\n");
    EXPECT_EQ(told.atEnd(), "");
}

TEST_F(DChannelTest, ComparesARepetitionWithItsOwnRoundOfNumbersAlone) {
    std::string story;
    const auto add = [&](int frame, double at) {
        std::ostringstream line;
        line << at << " > I " << frame % 128 << " 0 = 08 01 0" << frame / 128 << " 05\n"
             << at + 0.01 << " < RR " << (frame + 1) % 128 << "\n";
        story += line.str();
    };
    for (int frame = 0; frame < 131; ++frame)
        add(frame, frame);
    add(133, 133);  // 131 and 132 are missing
    add(132, 134);  // and then 132 is repeated
    const std::string text = told(story);
    EXPECT_EQ(text.substr(text.find('[')),
              "[hole at 263: 2 from 3 by recorder]\n"
              "264 user response up\n"
              "265 user command refused again up\n"
              "266 user response up\n");
}

}  // namespace
