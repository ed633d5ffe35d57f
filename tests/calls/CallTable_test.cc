#include "calls/CallTable.h"

#include <gtest/gtest.h>

#include <array>
#include <string>

#include "calls/causes.h"
#include "tests/calls/CallScript.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

// The calls of a script, a line each, in the order in which they are handed out: number, origin, reference,
// outcome, how and by whom ended, cause, flags.
std::string lineOf(const Call& call) {
    std::string line = std::to_string(call.number);
    line += call.origin == Side::us ? " us " : " peer ";
    line += std::to_string(call.reference);
    for (const std::string_view word : {nameOf(call.outcome), nameOf(call.endedBy), nameOf(call.clearedBy)})
        line.append(" ").append(word);
    line += call.cause ? " " + std::to_string(call.cause->value) : " -";
    const std::string flags = flagsOf(call);
    return line + (flags.empty() ? "" : " " + flags) + "\n";
}

class Seen : public CallObserver {
  public:
    void gone(const Call& call) override {
        lines += lineOf(call);
        calls.push_back(call);
    }
    void replaced(Call& old, Call& by, const Message&) override {
        lines += std::to_string(by.number) + " replaces " + std::to_string(old.number) + "\n";
    }
    void stray(const Message& message) override { lines += "stray " + std::to_string(message.number) + "\n"; }

    std::string lines;
    std::vector<Call> calls;
};

class CallTableTest : public testing::Test {
  protected:
    std::string play(const CallScript& script) {
        for (const Sent& sent : script.frames()) {
            const Message message = script.toMessage(sent);
            Call* const call = table.take(message);
            belongs.push_back(call == nullptr ? 0 : call->number);
        }
        table.finish();
        return seen.lines;
    }

    Timers timers;
    CallNumbers numbers;
    Seen seen;
    CallTable table{timers, numbers, seen};
    std::vector<std::uint64_t> belongs;  // by frame: the number of its call, or 0
};

CallScript answeredCall(std::uint16_t ref = 9) {
    CallScript script;
    script.at(0).us(m::setup, ref, false, {bearerSpeech(), channel(30), called("100")});
    script.at(20).peer(m::callProceeding, ref, true, {channel(30)});
    script.at(100).peer(m::alerting, ref, true);
    script.at(3000).peer(m::connect, ref, true);
    script.at(3010).us(m::connectAcknowledge, ref, false);
    return script;
}

}  // namespace

TEST_F(CallTableTest, FollowsAnAnsweredCallToItsEnd) {
    CallScript script = answeredCall();
    script.at(63000).peer(m::disconnect, 9, true, {cause(16, 2)});
    script.at(63010).us(m::release, 9, false);
    script.at(63020).peer(m::releaseComplete, 9, true);
    EXPECT_EQ(play(script), "1 us 9 answered release peer 16\n");
    const Call& call = seen.calls.at(0);
    EXPECT_EQ(call.firstResponse, 20 * millisecond);
    EXPECT_EQ(call.alerting, 100 * millisecond);
    EXPECT_EQ(call.connect, 3000 * millisecond);
    EXPECT_EQ(call.duration, 60 * second);
    EXPECT_EQ(call.called.digits, "100");
    ASSERT_TRUE(call.granted);
    EXPECT_TRUE(call.granted->channels.test(30));
    EXPECT_EQ(call.frames, (std::vector<std::uint64_t>{1, 2, 3, 4, 5, 6, 7, 8}));
    EXPECT_EQ(madeBy(*call.cause), Made::thisExchange);
    EXPECT_FALSE(hasFailed(call));
}

TEST_F(CallTableTest, TakesOneReferenceOfBothSidesForTwoCalls) {
    CallScript script;
    script.at(0).us(m::setup, 5, false).peer(m::setup, 5, false);
    script.at(10).us(m::releaseComplete, 5, true, {cause(17)});
    script.at(20).peer(m::releaseComplete, 5, true, {cause(34, 2)});
    EXPECT_EQ(play(script), "2 peer 5 busy release us 17\n1 us 5 congestion release peer 34\n");
    EXPECT_EQ(belongs, (std::vector<std::uint64_t>{1, 2, 2, 1}));
}

TEST_F(CallTableTest, TakesTheSameSetupWithinTwiceT303ForARepetition) {
    CallScript script;
    script.at(0).us(m::setup, 5, false, {called("1")});
    script.at(4000).us(m::setup, 5, false, {called("1")});
    script.at(5000).peer(m::releaseComplete, 5, true, {cause(1, 2)});
    EXPECT_EQ(play(script), "1 us 5 number release peer 1 setup-repeated\n");
    EXPECT_TRUE(hasFailed(seen.calls.at(0)));
    EXPECT_EQ(seen.calls.at(0).called.digits, "1");  // the repetition adds no digits
}

TEST_F(CallTableTest, TakesAnyOtherSetupForANewCall) {
    struct {
        const char* says;
        std::int64_t later;
        const char* number;
        bool answered;
    } const cases[] = {
        {"too late", 8001, "1", false}, {"other digits", 4000, "2", false}, {"answered", 4000, "1", true}};
    for (const auto& each : cases) {
        Seen own;
        CallTable ownTable(timers, numbers, own);
        numbers.last = 0;
        CallScript script;
        script.at(0).us(m::setup, 5, false, {called("1")});
        if (each.answered)
            script.at(10).peer(m::callProceeding, 5, true);
        script.at(each.later).us(m::setup, 5, false, {called(each.number)});
        for (const Sent& sent : script.frames())
            ownTable.take(script.toMessage(sent));
        ownTable.finish();
        EXPECT_EQ(own.lines,
                  "2 replaces 1\n1 us 5 other replaced nobody -\n2 us 5 open open unknown - open\n")
            << each.says;
    }
}

TEST_F(CallTableTest, EndsALifeAtTheSecondReleaseOfACollision) {
    CallScript script = answeredCall();
    script.crossing()
        .at(5000)
        .us(m::release, 9, false, {cause(16)})
        .peer(m::release, 9, true, {cause(16, 2)});
    EXPECT_EQ(play(script), "1 us 9 answered release both 16\n");
}

TEST_F(CallTableTest, SaysThatBothClearedOnlyIfNeitherHadSeenTheOther) {
    CallScript script = answeredCall();
    script.crossing()
        .at(5000)
        .us(m::disconnect, 9, false, {cause(16)})
        .peer(m::disconnect, 9, true, {cause(16, 2)});
    script.at(5010).us(m::release, 9, false).peer(m::release, 9, true);
    EXPECT_EQ(play(script), "1 us 9 answered release both 16\n");
}

// N(R) of one D channel of a group says nothing about the frames of another.
TEST_F(CallTableTest, NamesWhoClearedFirstIfTheClearingPassesToAnotherDChannel) {
    CallScript script = answeredCall();
    script.at(5000).us(m::disconnect, 9, false, {cause(16)}).on("other").at(6000);
    script.peer(m::release, 9, true, {cause(31)}).us(m::releaseComplete, 9, false);
    EXPECT_EQ(play(script), "1 us 9 answered release us 16\n");
}

TEST_F(CallTableTest, GivesStragglersToTheOldLife) {
    CallScript script = answeredCall();
    script.at(5000).us(m::release, 9, false, {cause(16)});
    script.at(5010).peer(m::releaseComplete, 9, true);
    script.at(6000).peer(m::releaseComplete, 9, true);
    EXPECT_EQ(play(script), "1 us 9 answered release us 16\n");
    EXPECT_EQ(belongs.back(), 1U);
}

TEST_F(CallTableTest, CallsAMessageThatComesLongAfterTheEndAStray) {
    CallScript script = answeredCall();
    script.at(5000).us(m::releaseComplete, 9, false, {cause(16)});
    script.at(15000).peer(m::disconnect, 9, true, {cause(16)});
    EXPECT_EQ(play(script), "1 us 9 answered release us 16\nstray 7\n");
}

TEST_F(CallTableTest, KnowsACallFromBeforeTheTrace) {
    CallScript script;
    script.at(0).peer(m::disconnect, 7, false, {cause(16, 5)});
    script.at(10).us(m::release, 7, true);
    script.at(20).peer(m::releaseComplete, 7, false);
    EXPECT_EQ(play(script), "1 peer 7 other release peer 16 before-trace\n");
    EXPECT_FALSE(hasFailed(seen.calls.at(0)));
}

TEST_F(CallTableTest, ReportsOpenCallsLastAtTheEnd) {
    CallScript script;
    script.at(0).us(m::setup, 1, false);
    script.at(1).us(m::setup, 2, false);
    script.at(2).peer(m::releaseComplete, 2, true, {cause(47, 2)});
    EXPECT_EQ(play(script), "2 us 2 congestion release peer 47\n1 us 1 open open unknown - open\n");
}

TEST_F(CallTableTest, NamesACallAbandonedWhoseCallerClearsBeforeConnect) {
    CallScript script;
    script.at(0).peer(m::setup, 3, false);
    script.at(10).us(m::alerting, 3, true);
    script.at(900).peer(m::disconnect, 3, false, {cause(16, 0)});
    script.at(910).us(m::release, 3, true);
    script.at(920).peer(m::releaseComplete, 3, false);
    EXPECT_EQ(play(script), "1 peer 3 abandoned release peer 16\n");
}

TEST_F(CallTableTest, EndsCallsThatAPeersStatusDoesNotKnow) {
    CallScript script = answeredCall();
    script.at(5000).us(m::statusEnquiry, 9, false);
    script.at(5010).peer(m::status, 9, true, {cause(30, 2), callState(0)});
    EXPECT_EQ(play(script), "1 us 9 answered release nobody -\n");
}

TEST_F(CallTableTest, EndsTheCallsOfARestartedChannel) {
    CallScript script = answeredCall();
    for (const Sent& sent : script.frames())
        table.take(script.toMessage(sent));
    CallScript acknowledge;
    acknowledge.at(9000).us(m::restartAcknowledge, 0, true, {channel(29), restartIndicator(0)});
    table.restarted(acknowledge.toMessage(acknowledge.frames().back()));
    EXPECT_EQ(table.open().size(), 1U);
    acknowledge.at(9100).us(m::restartAcknowledge, 0, true, {channel(30), restartIndicator(0)});
    table.restarted(acknowledge.toMessage(acknowledge.frames().back()));
    table.finish();
    EXPECT_EQ(seen.lines, "1 us 9 answered restart nobody -\n");
    EXPECT_TRUE(hasFailed(seen.calls.at(0)));
}

TEST_F(CallTableTest, EndsCallsOnlyWhenTheLinkIsDownLongerThanT309) {
    CallScript script = answeredCall();
    for (const Sent& sent : script.frames())
        table.take(script.toMessage(sent));
    table.linkDown(0, 10 * second);
    table.advance(90 * second);
    table.linkUp(0);
    table.advance(200 * second);
    EXPECT_EQ(table.open().size(), 1U);
    table.linkDown(0, 200 * second);
    table.advance(291 * second);
    table.finish();
    EXPECT_EQ(seen.lines, "1 us 9 answered link nobody -\n");
    EXPECT_EQ(seen.calls.at(0).duration, 290 * second - 3000 * millisecond);
}

TEST_F(CallTableTest, JoinsAResumedCallToTheSuspendedOneByItsIdentity) {
    CallScript script = answeredCall();
    script.at(5000).us(m::suspend, 9, false, {callIdentity(0x42)});
    script.at(5010).peer(m::suspendAcknowledge, 9, true);
    script.at(9000).us(m::resume, 11, false, {callIdentity(0x42)});
    script.at(9010).peer(m::resumeAcknowledge, 11, true, {channel(1)});
    script.at(12000).us(m::releaseComplete, 11, false, {cause(16)});
    EXPECT_EQ(play(script), "1 us 9 answered suspended nobody -\n2 us 11 answered release us 16 resumed\n");
    EXPECT_EQ(seen.calls.at(1).resumes, 1U);
}

TEST_F(CallTableTest, JoinsTheAnswersOfSeveralTerminalsToOneCall) {
    CallScript script(capture::Role::network);
    script.at(0).broadcast(Side::us, m::setup, 4, {bearerSpeech(), called("21")});
    script.at(100).tei(64).peer(m::alerting, 4, true);
    script.at(150).tei(65).peer(m::alerting, 4, true);
    script.at(160).tei(66).peer(m::releaseComplete, 4, true, {cause(88)});
    script.at(3000).tei(65).peer(m::connect, 4, true);
    script.at(3010).tei(65).us(m::connectAcknowledge, 4, false, {channel(1)});
    script.at(3020).tei(64).us(m::release, 4, false, {cause(26, 2)});
    script.at(3030).tei(64).peer(m::releaseComplete, 4, true);
    script.at(9000).tei(65).peer(m::disconnect, 4, true, {cause(16)});
    script.at(9010).tei(65).us(m::release, 4, false);
    script.at(9020).tei(65).peer(m::releaseComplete, 4, true);
    EXPECT_EQ(play(script), "1 us 4 answered release peer 16 broadcast\n");
    EXPECT_EQ(seen.calls.at(0).tei, 65);
    EXPECT_EQ(belongs, std::vector<std::uint64_t>(11, 1));
    EXPECT_EQ(seen.calls.at(0).duration, 6 * second);
}

TEST_F(CallTableTest, TakesTheReleaseOfATerminalThatLostForItsOwnAlsoBeforeConnectAcknowledge) {
    CallScript script(capture::Role::network);
    script.at(0).broadcast(Side::us, m::setup, 4, {bearerSpeech(), called("21")});
    script.at(100).tei(64).peer(m::alerting, 4, true);
    script.at(150).tei(65).peer(m::alerting, 4, true);
    script.at(3000).tei(65).peer(m::connect, 4, true);
    script.at(3010).tei(64).us(m::release, 4, false, {cause(26, 2)});
    script.at(3020).tei(65).us(m::connectAcknowledge, 4, false, {channel(1)});
    script.at(3030).tei(64).peer(m::releaseComplete, 4, true);
    script.at(9000).tei(65).peer(m::disconnect, 4, true, {cause(16)});
    script.at(9010).tei(65).us(m::release, 4, false);
    script.at(9020).tei(65).peer(m::releaseComplete, 4, true);
    EXPECT_EQ(play(script), "1 us 4 answered release peer 16 broadcast\n");
    EXPECT_EQ(seen.calls.at(0).duration, 6 * second);
}

TEST_F(CallTableTest, WaitsForTerminalsFromTheRepetitionOfASetupToAllOn) {
    CallScript script(capture::Role::network);
    script.at(0).broadcast(Side::us, m::setup, 4, {called("21")});
    script.at(4000).broadcast(Side::us, m::setup, 4, {called("21")});
    script.at(7500).tei(64).peer(m::alerting, 4, true);
    script.at(9000).tei(64).peer(m::connect, 4, true);
    script.at(9010).tei(64).us(m::connectAcknowledge, 4, false, {channel(1)});
    script.at(20000).tei(64).peer(m::disconnect, 4, true, {cause(16)});
    script.at(20010).tei(64).us(m::release, 4, false);
    script.at(20020).tei(64).peer(m::releaseComplete, 4, true);
    EXPECT_EQ(play(script), "1 us 4 answered release peer 16 setup-repeated broadcast\n");
    EXPECT_EQ(belongs, std::vector<std::uint64_t>(8, 1));
}

TEST_F(CallTableTest, EndsACallToAllThatNobodyTakesAtT312) {
    CallScript script(capture::Role::network);
    script.at(0).broadcast(Side::us, m::setup, 4);
    script.at(160).tei(66).peer(m::releaseComplete, 4, true, {cause(17)});
    script.at(20000).broadcast(Side::us, m::setup, 6);
    EXPECT_EQ(play(script),
              "1 us 4 busy release peer 17 broadcast\n2 us 6 open open unknown - open broadcast\n");
}

// The network passes on the cause that says most about the user (Q.931 5.2.5.4): a telephone that is busy
// says more than a fax machine that cannot take speech, and a person who rejects the call more than both.
TEST_F(CallTableTest, TakesTheCauseThatSaysMostWhereAllTerminalsRefuse) {
    struct {
        std::array<std::uint8_t, 3> refusals;
        const char* line;
    } const cases[] = {{{88, 17, 65}, "1 us 4 busy release peer 17 broadcast\n"},
                       {{17, 21, 88}, "1 us 4 rejected release peer 21 broadcast\n"},
                       {{21, 17, 21}, "1 us 4 rejected release peer 21 broadcast\n"},
                       {{65, 88, 18}, "1 us 4 incompatible release peer 65 broadcast\n"}};
    for (const auto& each : cases) {
        Seen own;
        CallNumbers ownNumbers;
        CallTable calls(timers, ownNumbers, own);
        CallScript script(capture::Role::network);
        script.at(0).broadcast(Side::us, m::setup, 4);
        for (std::size_t i = 0; i < each.refusals.size(); ++i) {
            const auto tei = static_cast<std::uint8_t>(64 + i);
            script.at(100).tei(tei).peer(m::releaseComplete, 4, true, {cause(each.refusals[i])});
        }
        for (const Sent& sent : script.frames())
            calls.take(script.toMessage(sent));
        calls.advance(20 * second);
        calls.finish();
        EXPECT_EQ(own.lines, each.line);
        EXPECT_FALSE(own.calls.at(0).causeBefore);
    }
}

TEST_F(CallTableTest, KeepsTheFirstRefusalBesideTheCauseOfACallToAllThatIsClearedLater) {
    CallScript script(capture::Role::network);
    script.at(0).broadcast(Side::us, m::setup, 4);
    script.at(100).tei(64).peer(m::releaseComplete, 4, true, {cause(88)});
    script.at(110).tei(65).peer(m::releaseComplete, 4, true, {cause(17)});
    script.at(150).tei(66).peer(m::alerting, 4, true);
    script.at(3000).tei(66).us(m::release, 4, false, {cause(16, 2)});
    script.at(3010).tei(66).peer(m::releaseComplete, 4, true);
    EXPECT_EQ(play(script), "1 us 4 abandoned release us 16 broadcast\n");
    EXPECT_EQ(seen.calls.at(0).causeBefore->value, 88);
}

// Terminals that the network lets go have not refused.
TEST_F(CallTableTest, SaysThatTheNetworkClearedACallToAllWhoseTerminalsItReleased) {
    CallScript script(capture::Role::network);
    script.at(0).broadcast(Side::us, m::setup, 4);
    script.at(150).tei(64).peer(m::alerting, 4, true);
    script.at(3000).tei(64).us(m::release, 4, false, {cause(26, 2)});
    script.at(3010).tei(64).peer(m::releaseComplete, 4, true);
    script.at(20000).broadcast(Side::us, m::setup, 6);
    play(script);
    EXPECT_EQ(seen.calls.at(0).clearedBy, ClearedBy::us);
}

TEST_F(CallTableTest, SaysThatNobodyClearedACallToAllThatNoTerminalAnswered) {
    CallScript script(capture::Role::network);
    script.at(0).broadcast(Side::us, m::setup, 4);
    script.at(20000).broadcast(Side::us, m::setup, 6);
    EXPECT_EQ(play(script),
              "1 us 4 no-answer release nobody - broadcast\n"
              "2 us 6 open open unknown - open broadcast\n");
}

TEST_F(CallTableTest, JoinsTheDigitsOfOverlapSending) {
    CallScript script;
    script.at(0).us(m::setup, 9, false, {bearerSpeech(), called("1")});
    script.at(20).peer(m::setupAcknowledge, 9, true, {channel(3)});
    script.at(500).us(m::information, 9, false, {called("23")});
    script.at(900).us(m::information, 9, false, {called("4")});
    script.at(1000).peer(m::callProceeding, 9, true);
    script.at(1100).us(m::information, 9, false, {called("99")});
    script.at(1200).peer(m::disconnect, 9, true, {cause(1, 2)});
    play(script);
    EXPECT_EQ(seen.calls.at(0).called.digits, "1234");
    EXPECT_EQ(seen.calls.at(0).lastDigit, 900 * millisecond);
    EXPECT_TRUE(seen.calls.at(0).overlap);
}

TEST_F(CallTableTest, JoinsDigitsThatComeNowAsANumberAndNowFromTheKeypad) {
    const auto keypad = [](const std::string& text) {
        Bytes element{0x2C, static_cast<std::uint8_t>(text.size())};
        element.insert(element.end(), text.begin(), text.end());
        return element;
    };
    CallScript script;
    script.at(0).us(m::setup, 1, false, {keypad("1")}).peer(m::setupAcknowledge, 1, true);
    script.us(m::information, 1, false, {called("2")}).us(m::information, 1, false, {keypad("3")});
    script.us(m::information, 1, false, {called("4")}).peer(m::callProceeding, 1, true);
    play(script);
    ASSERT_EQ(seen.calls.size(), 1U);
    EXPECT_EQ(seen.calls[0].called.digits, "1234");
    EXPECT_EQ(seen.calls[0].called.plan, 1);
}

TEST_F(CallTableTest, KnowsAConnectionOnTheDChannelFromItsSetupOn) {
    CallScript script;
    std::uint16_t ref = 0;
    // No channel and the D-channel indicator; no channel yet, of a call that waits.
    for (const std::uint8_t octet : {0x8C, 0x88}) {
        script.at(0).us(m::setup, ++ref, false, {bearer64k(), Bytes{0x18, 0x01, octet}});
        script.peer(m::releaseComplete, ref, true, {cause(17)});
    }
    play(script);
    ASSERT_EQ(seen.calls.size(), 2U);
    EXPECT_EQ(seen.calls[0].kind, Kind::signalling);
    EXPECT_EQ(seen.calls[1].kind, Kind::call);
}

TEST_F(CallTableTest, KeepsTheCauseOfTheFirstClearingMessageAndTheOthersBesideIt) {
    CallScript script;
    script.at(0).us(m::setup, 9, false);
    script.at(20).peer(m::progress, 9, true, {cause(34, 3), progress(8)});
    script.at(50).peer(m::disconnect, 9, true, {cause(41, 3)});
    script.at(60).us(m::release, 9, false, {cause(16)});
    script.at(70).peer(m::releaseComplete, 9, true, {cause(96, 2)});
    EXPECT_EQ(play(script), "1 us 9 congestion release peer 41\n");
    const Call& call = seen.calls.at(0);
    ASSERT_TRUE(call.causeBefore);
    EXPECT_EQ(call.causeBefore->value, 34);
    ASSERT_EQ(call.laterCauses.size(), 2U);
    EXPECT_EQ(call.laterCauses[0].value, 16);
    EXPECT_EQ(call.laterCauses[1].value, 96);
    EXPECT_EQ(madeBy(*call.cause), Made::beyond);
    EXPECT_EQ(madeBy(call.laterCauses[1]), Made::here);
}

TEST_F(CallTableTest, GivesNoDurationToAnAnsweredCallWhoseConnectIsNotInTheTrace) {
    for (const std::uint8_t shows : {m::connectAcknowledge, m::retrieveAcknowledge, m::resumeAcknowledge}) {
        Seen without;
        CallNumbers number;
        CallTable calls{timers, number, without};
        CallScript script;
        script.at(0).peer(shows, 9, true);
        script.at(30000).us(m::releaseComplete, 9, false, {cause(16)});
        for (const Sent& sent : script.frames())
            calls.take(script.toMessage(sent));
        calls.finish();
        EXPECT_EQ(without.lines, "1 us 9 answered release us 16 before-trace\n");
        EXPECT_FALSE(without.calls.at(0).duration) << int{shows};
    }
}

TEST_F(CallTableTest, TakesACauseOfAnotherCodingStandardForNoneThatItKnows) {
    constexpr std::uint8_t national = 2 << 5, invalidReference = 81;
    CallScript script;
    script.at(0).us(m::setup, 9, false);
    script.at(50).peer(m::releaseComplete, 9, true, {cause(invalidReference, national | 2)});
    EXPECT_EQ(play(script), "1 us 9 other release peer 81\n");
    EXPECT_EQ(seen.calls.at(0).cause->codingStandard, 2);
    EXPECT_EQ(madeBy(*seen.calls.at(0).cause), Made::thisExchange);
}

TEST_F(CallTableTest, MessagesOfTheGlobalOrTheDummyReferenceBelongToNoCall) {
    CallScript script;
    script.at(0)
        .us(m::restart, 0, false, {restartIndicator(7)})
        .peer(m::restartAcknowledge, 0, true, {restartIndicator(7)});
    EXPECT_EQ(play(script), "");
    EXPECT_EQ(belongs, (std::vector<std::uint64_t>{0, 0}));
}

TEST_F(CallTableTest, DropsTheOldestCallWhenTooManyAreAlive) {
    CallScript script;
    script.us(m::setup, 1, false);
    Message message = script.toMessage(script.frames().front());
    for (std::uint64_t i = 0; i < CallTable::mostAlive + 3; ++i) {
        message.layer3.callReference.value = i + 1;
        table.take(message);
    }
    EXPECT_EQ(table.alive(), CallTable::mostAlive);
    EXPECT_EQ(table.dropped(), 3U);
    EXPECT_EQ(seen.calls.size(), 3U);
    EXPECT_TRUE(seen.calls.at(0).uncertain);
}

}  // namespace calls
