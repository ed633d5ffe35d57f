#include "calls/Waits.h"

#include <gtest/gtest.h>

#include "tests/calls/Findings.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

// An earlier call, so that both directions have been heard.
CallScript afterACall(capture::Role role = capture::Role::user) {
    CallScript script(role);
    script.at(0).us(m::setup, 1, false, {bearerSpeech(), channel(1)});
    script.at(5).peer(m::releaseComplete, 1, true, {cause(17)});
    return script;
}

}  // namespace

TEST(Waits, FindASetupThatIsNotAnsweredAfterItsRepetition) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(14000).us(m::setup, 2, false, {bearerSpeech()});
    EXPECT_EQ(findingsOf(script, 17990), "4 setup-repeated\n");
    EXPECT_EQ(findingsOf(script, 18010), "4 setup-repeated\n4 setup-unanswered\n");
}

TEST(Waits, EndWithAnyAnswerToSetup) {
    for (const std::uint8_t answer : {m::callProceeding, m::setupAcknowledge, m::alerting, m::connect}) {
        CallScript script = afterACall();
        script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
        script.at(13900).peer(answer, 2, true);
        EXPECT_EQ(findingsOf(script, 19000), "") << int{answer};
    }
}

TEST(Waits, FindAConnectOfTheUserThatTheNetworkDoesNotAcknowledge) {
    CallScript script = afterACall(capture::Role::user);
    script.at(10000).peer(m::setup, 2, false, {bearerSpeech(), channel(1)});
    script.at(11000).us(m::connect, 2, true);
    EXPECT_EQ(findingsOf(script, 14900), "");
    EXPECT_EQ(findingsOf(script, 15100), "4 connect-not-acknowledged\n");
    script.at(12000).peer(m::connectAcknowledge, 2, false);
    EXPECT_EQ(findingsOf(script, 15100), "");
}

TEST(Waits, AreSilentIfTheCallerNeverAcknowledgesConnect) {
    CallScript script = afterACall(capture::Role::user);
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::connect, 2, true);
    EXPECT_EQ(findingsOf(script, 30000), "");
}

TEST(Waits, NoteAConnectThatTheUserDoesNotAcknowledgeAlthoughItDidBefore) {
    CallScript script = afterACall(capture::Role::user);
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::connect, 2, true);
    script.at(11010).us(m::connectAcknowledge, 2, false);
    script.at(20000).us(m::setup, 3, false, {bearerSpeech()});
    script.at(21000).peer(m::connect, 3, true);
    EXPECT_EQ(findingsOf(script, 30000), "7 connect-acknowledge-missing\n");
}

TEST(Waits, FindADisconnectThatNobodyAnswers) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::connect, 2, true);
    script.at(12000).us(m::disconnect, 2, false, {cause(16)});
    EXPECT_EQ(findingsOf(script, 41900), "");
    EXPECT_EQ(findingsOf(script, 42100), "5 disconnect-unanswered\n");
    script.at(42000).us(m::release, 2, false);
    script.at(42010).peer(m::releaseComplete, 2, true);
    EXPECT_EQ(findingsOf(script, 50000), "5 disconnect-unanswered\n");
}

TEST(Waits, GiveADisconnectWithAnAnnouncementTheTimeOfT306) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::callProceeding, 2, true);
    script.at(12000).peer(m::disconnect, 2, true, {cause(1, 2), progress(8)});
    script.at(37000).us(m::release, 2, false);
    script.at(37010).peer(m::releaseComplete, 2, true);
    EXPECT_EQ(findingsOf(script, 60000), "");
}

TEST(Waits, LetTheSenderOfADisconnectGoOnBeforeItsTimerRunsOut) {
    for (const std::uint8_t indicator : {1, 8}) {
        CallScript script = afterACall();
        script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
        script.at(11000).peer(m::callProceeding, 2, true);
        script.at(12000).peer(m::disconnect, 2, true, {cause(1, 2), progress(indicator)});
        script.at(32000).peer(m::release, 2, true).us(m::releaseComplete, 2, false);
        EXPECT_EQ(findingsOf(script, 60000), "") << int{indicator};
    }
}

TEST(Waits, TakeDisconnectsThatCrossForAnswers) {
    for (const Side one : {Side::us, Side::peer}) {
        CallScript script = afterACall();
        script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
        script.at(11000).peer(m::connect, 2, true);
        const Side another = other(one);
        script.at(12000).crossing();
        script.message(one, m::disconnect, 2, one == Side::peer, {cause(16)});
        script.message(another, m::disconnect, 2, another == Side::peer, {cause(16)});
        script.at(12010).acknowledge(Side::us).acknowledge(Side::peer);
        script.at(12050).message(another, m::release, 2, another == Side::peer);
        script.at(12100).message(one, m::releaseComplete, 2, one == Side::peer);
        EXPECT_EQ(findingsOf(script, 60000), "") << (one == Side::us);
    }
}

TEST(Waits, FindAReleaseThatIsNotAnsweredAfterItsRepetition) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::connect, 2, true);
    script.at(12000).us(m::release, 2, false, {cause(16)});
    script.at(16000).us(m::release, 2, false, {cause(16)});
    EXPECT_EQ(findingsOf(script, 19900), "6 release-repeated\n");
    EXPECT_EQ(findingsOf(script, 20100), "6 release-repeated\n6 release-unanswered\n");
}

TEST(Waits, TakeACollisionOfReleasesForAnswers) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::connect, 2, true);
    script.crossing().at(12000).us(m::release, 2, false, {cause(16)}).peer(m::release, 2, true, {cause(16)});
    EXPECT_EQ(findingsOf(script, 60000), "");
}

TEST(Waits, FindACallThatStopsAfterCallProceeding) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(10100).peer(m::callProceeding, 2, true);
    EXPECT_EQ(findingsOf(script, 130000), "");  // the user's T310 is 120 s
    EXPECT_EQ(findingsOf(script, 130200), "4 proceeding-unanswered\n");
    script.at(20000).peer(m::progress, 2, true, {progress(8)});
    EXPECT_EQ(findingsOf(script, 130200), "");
}

TEST(Waits, EndWithTheConnectOfTheSideThatAlerted) {
    for (const bool answered : {false, true}) {
        CallScript script = afterACall();
        script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
        script.at(11000).peer(m::alerting, 2, true);
        if (answered)
            script.at(15000).peer(m::connect, 2, true);
        EXPECT_EQ(findingsOf(script, 191100), answered ? "" : "4 alerting-unanswered\n");  // T301 is 180 s
    }
}

TEST(Waits, LetTheCallerGiveUpAtTheTimerWhenNobodyAnswers) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::alerting, 2, true);
    script.at(191000).us(m::disconnect, 2, false, {cause(16)}).peer(m::release, 2, true);
    script.us(m::releaseComplete, 2, false);
    EXPECT_EQ(findingsOf(script, 400000), "");
}

TEST(Waits, FindAStatusEnquiryThatIsNotAnswered) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::connect, 2, true);
    script.at(12000).us(m::statusEnquiry, 2, false);
    script.at(16000).us(m::statusEnquiry, 2, false);
    EXPECT_EQ(findingsOf(script, 20100), "6 status-enquiry-unanswered\n");
    script.at(17000).peer(m::status, 2, true, {cause(30), callState(10)});
    EXPECT_EQ(findingsOf(script, 20100), "");
}

TEST(Waits, AreKeptForEachTerminalOfACallToAll) {
    for (const bool faulty : {false, true}) {
        CallScript script = afterACall(capture::Role::network);
        script.at(10000).broadcast(Side::us, m::setup, 4, {bearerSpeech(), channel(1)});
        script.at(10100).tei(64).peer(m::connect, 4, true);
        script.at(10200).tei(65).peer(m::connect, 4, true);
        script.at(10300).tei(64).us(m::connectAcknowledge, 4, false, {channel(1)});
        if (!faulty)
            script.at(10400).tei(65).us(m::release, 4, false, {cause(26, 2)});
        if (!faulty)
            script.at(10500).tei(65).peer(m::releaseComplete, 4, true);
        script.at(30000).tei(64).us(m::disconnect, 4, false, {cause(16)});
        if (!faulty)
            script.at(30100).tei(64).peer(m::release, 4, true);
        if (!faulty)
            script.at(30200).tei(64).us(m::releaseComplete, 4, false);
        EXPECT_EQ(findingsOf(script, 90000),
                  faulty ? "5 connect-not-acknowledged\n7 disconnect-unanswered\n" : "");
    }
}

TEST(Waits, SayThatItCannotBeToldWhenTheLinkLeavesADoubt) {
    CallScript script = afterACall();
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    struct {
        const char* says;
        void (*spoil)(LinkWitness&);
    } const doubts[] = {
        {"down", [](LinkWitness& link) { link.up = false; }},
        {"was down", [](LinkWitness& link) { link.lastDown = 12 * second; }},
        {"not acknowledged", [](LinkWitness& link) { link.acknowledged[0] = 2; }},
        {"hole", [](LinkWitness& link) { link.lastHole[1] = 12 * second; }},
    };
    for (const auto& doubt : doubts) {
        HealthyLink link;
        doubt.spoil(link.own);
        EXPECT_EQ(findingsOf(script, 20000, link), "3 cannot-be-told\n") << doubt.says;
    }
}

TEST(Waits, SayNothingWhileOnlyOneDirectionIsHeard) {
    CallScript script;
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    HealthyLink link;
    link.own.heard[1] = false;
    EXPECT_EQ(findingsOf(script, 100000, link), "");
    EXPECT_EQ(findingsOf(script, 100000), "1 setup-unanswered\n");
}

namespace {

Bytes timerRanOut(const std::string& timer = {}) {
    Bytes element{0x08, static_cast<std::uint8_t>(2 + timer.size()), 0x80, 0x80 | 102};
    element.insert(element.end(), timer.begin(), timer.end());
    return element;
}

CallScript incomingConnected() {
    CallScript script = afterACall(capture::Role::user);
    script.at(10000).peer(m::setup, 2, false, {bearerSpeech(), channel(1)});
    script.at(11000).us(m::connect, 2, true);
    return script;
}

CallScript proceeding() {
    CallScript script = afterACall(capture::Role::user);
    script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
    script.at(11000).peer(m::callProceeding, 2, true);
    return script;
}

}  // namespace

TEST(Waits, FindWhatRanOutWhenTheWaitingSideClearsAtTheTimer) {
    for (const std::int64_t late : {-100, -8, 0, 4, 8}) {
        CallScript script = incomingConnected();
        script.at(15000 + late).us(m::disconnect, 2, true, {cause(16)}).peer(m::release, 2, false);
        script.us(m::releaseComplete, 2, true);
        EXPECT_EQ(findingsOf(script, 60000), late == -100 ? "" : "4 connect-not-acknowledged\n") << late;
        script = proceeding();
        script.at(131000 + late).us(m::disconnect, 2, false, {cause(16)}).peer(m::release, 2, true);
        script.us(m::releaseComplete, 2, false);
        EXPECT_EQ(findingsOf(script, 200000), late == -100 ? "" : "4 proceeding-unanswered\n") << late;
    }
}

TEST(Waits, FindWhatRanOutWhenTheWaitingSideSaysSo) {
    struct {
        Bytes cause;
        const char* finds;
    } const cases[] = {
        {timerRanOut(), "4 connect-not-acknowledged\n"},
        {timerRanOut("313"), "4 connect-not-acknowledged\n"},
        {timerRanOut("310"), "5 timer-102\n"},
    };
    for (const auto& each : cases) {
        CallScript script = incomingConnected();
        script.at(13000).us(m::disconnect, 2, true, {each.cause}).peer(m::release, 2, false);
        script.us(m::releaseComplete, 2, true);
        EXPECT_EQ(findingsOf(script, 60000), each.finds);
    }
    CallScript script = proceeding();
    script.at(30000).us(m::disconnect, 2, false, {timerRanOut("310")}).peer(m::release, 2, true);
    script.us(m::releaseComplete, 2, false);
    EXPECT_EQ(findingsOf(script, 60000), "4 proceeding-unanswered\n");
    // The other side, which nobody waits for here.
    script = proceeding();
    script.at(30000).peer(m::disconnect, 2, true, {timerRanOut("310")}).us(m::release, 2, false);
    script.peer(m::releaseComplete, 2, true);
    EXPECT_EQ(findingsOf(script, 60000), "5 timer-102\n");
}

TEST(Waits, FindOverlapSendingThatEndsAtT304) {
    for (const std::uint8_t value : {std::uint8_t{28}, std::uint8_t{102}, std::uint8_t{16}}) {
        CallScript script = afterACall(capture::Role::user);
        script.at(10000).us(m::setup, 2, false, {bearerSpeech(), called("1")});
        script.at(10020).peer(m::setupAcknowledge, 2, true, {channel(3)});
        script.at(12000).us(m::information, 2, false, {called("2")});
        script.at(32000).us(m::disconnect, 2, false, {cause(value)});
        script.at(32100).peer(m::release, 2, true).us(m::releaseComplete, 2, false);
        EXPECT_EQ(findingsOf(script, 60000), value == 16 ? "" : "5 overlap-timeout\n") << int{value};
    }
}

TEST(Waits, AreStoppedByAnAnnouncementInOverlapSending) {
    for (const bool announced : {false, true}) {
        CallScript script = afterACall(capture::Role::user);
        script.at(10000).us(m::setup, 2, false, {bearerSpeech(), called("1")});
        script.at(10020).peer(m::setupAcknowledge, 2, true, {channel(3)});
        if (announced)
            script.at(20000).peer(m::progress, 2, true, {progress(8)});
        EXPECT_EQ(findingsOf(script, 60000), announced ? "" : "4 overlap-timeout\n");
    }
}

TEST(Waits, NameTheTimerOfAnAnnouncementInTheClause) {
    for (const bool announces : {false, true}) {
        CallScript script = afterACall();
        script.at(10000).us(m::setup, 2, false, {bearerSpeech()});
        script.at(11000).peer(m::callProceeding, 2, true);
        script.at(12000).peer(m::disconnect, 2, true, {cause(1, 2), announces ? progress(8) : Bytes{}});
        const Timers timers;
        Found found;
        CallNumbers numbers;
        const HealthyLink link;
        Watched watched(timers, link, found);
        CallTable table(timers, numbers, watched);
        for (const Sent& sent : script.frames())
            table.take(script.toMessage(sent));
        watched.waits.advance(60000 * millisecond);
        ASSERT_EQ(found.lines, "5 disconnect-unanswered\n");
        EXPECT_EQ(found.findings[0].clause, announces ? "Q.931 5.3.4.1, T306" : "Q.931 5.3.3, T305");
    }
}

}  // namespace calls
