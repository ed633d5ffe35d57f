#include "calls/DChannel.h"

#include <gtest/gtest.h>

#include <sstream>

#include "tests/calls/Script.h"
#include "tests/calls/recorded.h"

namespace {

using namespace calls;
using calls::testing::frameOf;
using calls::testing::script;
using calls::testing::ScriptFrame;

std::string wordsOf(const Marks& marks) {
    std::string words;
    const auto add = [&](bool is, const std::string& word) {
        if (is)
            words += " " + word;
    };
    add(marks.role == capture::Role::user, "user");
    add(marks.role == capture::Role::network, "network");
    add(marks.command.has_value(), marks.command.value_or(false) ? "command" : "response");
    add(marks.accepted.has_value(), marks.accepted.value_or(false) ? "accepted" : "refused");
    add(marks.retransmitted, "again");
    add(marks.outOfSequence, "early");
    add(marks.pollUnanswered, "poll-unanswered");
    add(marks.linkUp, "link-up");
    add(marks.linkDown, "link-down");
    add(marks.unseenSetUp, "unseen-set-up");
    add(marks.contradictsRole, "contradicts");
    add(marks.keepAlive, "keep-alive");
    add(marks.answers.has_value(), "answers " + std::to_string(marks.answers.value_or(0)));
    return words + " " + std::string(nameOf(marks.state));
}

std::string wordsOf(const LinkEvent& event) {
    static constexpr const char* kinds[] = {"hole",         "nr-invalid",    "unseen-set-up",
                                            "set-up-again", "refused",       "unsolicited-answer",
                                            "frame-reject", "contradiction", "same-role"};
    static constexpr const char* losers[] = {"line", "recorder", "unknown"};
    std::ostringstream out;
    out << " [" << kinds[static_cast<std::size_t>(event.kind)] << " at " << event.frame;
    if (event.kind == LinkEvent::Kind::hole)
        out << ": " << event.hole.count << " from " << int{event.hole.first} << " by "
            << losers[static_cast<std::size_t>(event.by)];
    if (event.kind == LinkEvent::Kind::nrInvalid)
        out << ": " << int{event.number};
    out << "]";
    return out.str();
}

// What the machine says of each frame of a story, a line a frame: its number, late frames, marks, state,
// events.
class Told {
  public:
    explicit Told(DChannel& channel) : channel_(channel) {}

    std::string operator()(std::string_view story, bool network = false) {
        std::ostringstream out;
        for (const ScriptFrame& scripted : script(story, network)) {
            const Marks& marks = channel_.take(frameOf(scripted), ++number_, scripted.at);
            out << number_;
            for (const KeptFrame& late : channel_.late())
                out << " late " << late.number;
            out << wordsOf(marks);
            for (const LinkEvent& event : channel_.events())
                out << wordsOf(event);
            out << "\n";
        }
        return out.str();
    }
    std::string atEnd() {
        channel_.finish();
        std::string text;
        for (const LinkEvent& event : channel_.events())
            text += wordsOf(event);
        return text;
    }

  private:
    DChannel& channel_;
    std::uint64_t number_ = 0;
};

class DChannelTest : public ::testing::Test {
  protected:
    DChannel channel;
    Told told{channel};
};

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

TEST_F(DChannelTest, GivesWhatOneLinkHasShownToTheOthers) {
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

TEST_F(DChannelTest, LeavesAHoleUndecidedOfWhichNobodySpeaks) {
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

TEST_F(DChannelTest, DoesNotPassOnWhatArrivesBeforeTheLinkIsUp) {
    EXPECT_EQ(told("0 > SABME\n0.005 < I 9 9\n0.01 < UA\n0.02 < I 0 0\n"),
              "1 user command establishing\n"
              "2 user command refused establishing\n"
              "3 user response link-up up\n"
              "4 user command accepted up\n");
}

TEST_F(DChannelTest, KnowsThatALinkIsUpWhoseAnswerIsMissing) {
    EXPECT_EQ(told("0 > SABME\n1 > I 0 0\n1.1 < RR 1\n"),
              "1 user command establishing\n"
              "2 user command accepted up\n"
              "3 user response up\n");
}

TEST_F(DChannelTest, MarksAPollBehindOneThatWasNotAnswered) {
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

TEST_F(DChannelTest, LearnsNothingFromPollsThatCrossNorFromThoseOfOneSide) {
    EXPECT_EQ(told("0 > RR 0 P\n0.1 < RR 0 P\n"), "1 unknown\n2 up\n");
    DChannel another;
    EXPECT_EQ(Told(another)("0 < RR 5 P\n0.5 < RR 5 P\n"), "1 unknown\n2 unknown\n");
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

TEST_F(DChannelTest, TakesNumbersAsTheyComeOnALinkThatCameUpUnseen) {
    EXPECT_EQ(told("0 > I 0 0\n0.1 < RR 1\n2 > DISC\n2.1 < UA\n5 > I 40 7\n5.1 < RR 41\n"),
              "1 user command accepted unknown\n"
              "2 user response up\n"
              "3 user command releasing\n"
              "4 user response link-down down\n"
              "5 user command accepted up\n"
              "6 user response up\n");
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
