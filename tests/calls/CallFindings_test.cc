#include "calls/CallFindings.h"

#include <gtest/gtest.h>

#include "tests/calls/Findings.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

CallScript talking() {
    CallScript script;
    script.at(0).us(m::setup, 9, false, {bearerSpeech(), channel(30), called("100")});
    script.at(20).peer(m::callProceeding, 9, true, {channel(30)});
    script.at(3000).peer(m::connect, 9, true);
    script.at(3010).us(m::connectAcknowledge, 9, false);
    return script;
}

}  // namespace

TEST(CallFindings, AreSilentOnAHealthyCall) {
    CallScript script = talking();
    script.at(5000).us(m::disconnect, 9, false, {cause(16)});
    script.at(5010).peer(m::release, 9, true);
    script.at(5020).us(m::releaseComplete, 9, false);
    EXPECT_EQ(findingsOf(script, 100000), "");
}

TEST(CallFindings, MissTheCauseOnlyInTheMessageThatClearsFirst) {
    CallScript script = talking();
    script.at(5000).us(m::disconnect, 9, false);
    script.at(5010).peer(m::release, 9, true);
    script.at(5020).us(m::releaseComplete, 9, false);
    EXPECT_EQ(findingsOf(script, 100000), "5 element-absent\n");
}

TEST(CallFindings, MissMandatoryElements) {
    CallScript script;
    script.at(0).us(m::setup, 9, false, {called("1")});
    script.at(10).peer(m::progress, 9, true);
    script.at(20).peer(m::releaseComplete, 9, true);
    EXPECT_EQ(findingsOf(script, 1000), "1 element-absent\n2 element-absent\n3 element-absent\n");
}

TEST(CallFindings, NoteAnElementThatStandsTwiceUnlessItMay) {
    CallScript script;
    script.at(0).us(m::setup, 9, false, {bearerSpeech(), bearer64k(), called("1"), called("2")});
    script.at(10).peer(m::callProceeding, 9, true, {progress(1), progress(8)});
    script.at(20).peer(m::releaseComplete, 9, true, {cause(17)});
    EXPECT_EQ(findingsOf(script, 1000), "1 element-repeated\n");
}

TEST(CallFindings, FindATruncatedElement) {
    CallScript script;
    script.at(0).us(m::setup, 9, false, {bearerSpeech(), Bytes{0x70, 0x05, 0x81, 0x31}});
    script.at(20).peer(m::releaseComplete, 9, true, {cause(17)});
    EXPECT_EQ(findingsOf(script, 1000), "1 element-damaged\n");
}

TEST(CallFindings, FindCausesThatTellOfAnError) {
    struct {
        std::uint8_t value;
        const char* found;
    } const causes[] = {{81, "unknown-reference"}, {96, "protocol-error"},  {97, "element-ignored"},
                        {98, "protocol-error"},    {99, "element-ignored"}, {100, "protocol-error"},
                        {101, "protocol-error"},   {102, "timer-102"},      {111, "protocol-error"}};
    for (const auto& each : causes) {
        CallScript script = talking();
        script.at(5000).peer(m::status, 9, true, {cause(each.value), callState(10)});
        EXPECT_EQ(findingsOf(script, 6000), "5 " + std::string(each.found) + "\n") << int{each.value};
    }
}

TEST(CallFindings, TakeStatusForSoundThatAnswersAnEnquiry) {
    CallScript script = talking();
    script.at(5000).us(m::statusEnquiry, 9, false);
    script.at(5010).peer(m::status, 9, true, {cause(30), callState(10)});
    EXPECT_EQ(findingsOf(script, 60000), "");
    script.at(6000).peer(m::status, 9, true, {cause(30), callState(10)});
    EXPECT_EQ(findingsOf(script, 60000), "7 status-unasked\n");
}

TEST(CallFindings, FindAStatusThatDoesNotKnowALiveCall) {
    CallScript script = talking();
    script.at(5000).us(m::statusEnquiry, 9, false);
    script.at(5010).peer(m::status, 9, true, {cause(30), callState(0)});
    EXPECT_EQ(findingsOf(script, 60000), "6 status-incompatible\n");
}

TEST(CallFindings, FindAReferenceThatIsUsedWhileItIsAlive) {
    CallScript script = talking();
    script.at(5000).us(m::setup, 9, false, {bearerSpeech(), called("200")});
    script.at(5010).peer(m::releaseComplete, 9, true, {cause(17)});
    EXPECT_EQ(findingsOf(script, 60000), "5 reference-in-use\n");
}

TEST(CallFindings, FindAMessageForACallThatEndedLongAgo) {
    CallScript script = talking();
    script.at(5000).us(m::releaseComplete, 9, false, {cause(16)});
    script.at(8000).peer(m::release, 9, true, {cause(16)});
    EXPECT_EQ(findingsOf(script, 60000), "");
    script.at(30000).peer(m::release, 9, true, {cause(16)});
    EXPECT_EQ(findingsOf(script, 60000), "7 unknown-reference\n");
}

TEST(CallFindings, FindAnotherChannelOnlyIfSetupDemandedItsOwn) {
    for (const bool exclusive : {true, false}) {
        CallScript script;
        script.at(0).us(m::setup, 9, false, {bearerSpeech(), channel(30, exclusive)});
        script.at(20).peer(m::callProceeding, 9, true, {channel(29)});
        script.at(30).peer(m::releaseComplete, 9, true, {cause(17)});
        EXPECT_EQ(findingsOf(script, 1000), exclusive ? "2 channel-not-as-demanded\n" : "");
    }
}

TEST(CallFindings, NoteThatTheOtherEndWaitedForMoreDigits) {
    for (const bool complete : {false, true}) {
        CallScript script;
        script.at(0).us(m::setup, 9, false, {bearerSpeech(), called("1")});
        script.at(20).peer(m::setupAcknowledge, 9, true, {channel(3)});
        script.at(2000).us(m::information, 9, false, {called("2"), complete ? sendingComplete() : Bytes{}});
        script.at(14000).peer(m::callProceeding, 9, true);
        script.at(14500).peer(m::releaseComplete, 9, true, {cause(17)});
        EXPECT_EQ(findingsOf(script, 16000), complete ? "" : "4 waits-for-digits\n");
    }
}

TEST(CallFindings, FindOverlapSendingThatTimesOut) {
    CallScript script;
    script.at(0).us(m::setup, 9, false, {bearerSpeech(), called("1")});
    script.at(20).peer(m::setupAcknowledge, 9, true, {channel(3)});
    script.at(15100).peer(m::disconnect, 9, true, {cause(28, 2)});
    script.at(15200).us(m::release, 9, false);
    script.at(15300).peer(m::releaseComplete, 9, true);
    EXPECT_EQ(findingsOf(script, 60000), "3 overlap-timeout\n");
}

TEST(CallFindings, NoteASetupToAllThatNobodyAnswers) {
    CallScript script(capture::Role::network);
    script.at(0).broadcast(Side::us, m::setup, 4, {bearerSpeech(), channel(1)});
    EXPECT_EQ(findingsOf(script, 7000), "1 broadcast-unanswered\n");
    script.at(100).tei(64).peer(m::releaseComplete, 4, true, {cause(17)});
    EXPECT_EQ(findingsOf(script, 7000), "");
}

TEST(CallFindings, MissTheCauseInEveryDisconnect) {
    for (const bool sound : {false, true}) {
        CallScript script;
        script.at(0).us(m::setup, 9, false, {bearerSpeech()}).peer(m::connect, 9, true);
        script.at(100).crossing().us(m::disconnect, 9, false, {cause(16)});
        script.peer(m::disconnect, 9, true, {sound ? cause(16) : Bytes{}});
        script.us(m::release, 9, false).peer(m::releaseComplete, 9, true);
        EXPECT_EQ(findingsOf(script, 1000), sound ? "" : "4 element-absent\n");
    }
}

TEST(CallFindings, MissTheCauseOfACallFromBeforeTheTraceOnlyIfItWasAlive) {
    for (const bool alive : {false, true}) {
        CallScript script;
        if (alive)
            script.at(0).us(m::information, 9, false);
        script.at(100).us(m::release, 9, false).peer(m::releaseComplete, 9, true);
        EXPECT_EQ(findingsOf(script, 1000), alive ? "2 element-absent\n" : "");
    }
    CallScript script;
    script.at(0).us(m::disconnect, 9, false).peer(m::release, 9, true).us(m::releaseComplete, 9, false);
    EXPECT_EQ(findingsOf(script, 1000), "1 element-absent\n");
}

TEST(CallFindings, MissTheChannelInASetupOfTheNetworkAlone) {
    for (const capture::Role role : {capture::Role::user, capture::Role::network}) {
        CallScript script(role);
        script.at(0).us(m::setup, 9, false, {bearerSpeech()}).peer(m::releaseComplete, 9, true, {cause(17)});
        EXPECT_EQ(findingsOf(script, 1000), role == capture::Role::network ? "1 element-absent\n" : "");
    }
}

TEST(CallFindings, MissTheChannelInTheFirstAnswerOfTheNetworkIfItHadAChoice) {
    struct {
        const char* says;
        capture::Role role;
        Bytes asked, answered;
        bool missing;
    } const cases[] = {
        {"a channel that is preferred", capture::Role::user, channel(5, false), {}, true},
        {"any channel", capture::Role::user, {0x18, 0x01, 0xA3}, {}, true},
        {"the answer names one", capture::Role::user, channel(5, false), channel(6), false},
        {"only this channel", capture::Role::user, channel(5), {}, false},
        {"no channel", capture::Role::user, {0x18, 0x01, 0xA0}, {}, false},
        {"nothing", capture::Role::user, {}, {}, false},
        {"the user answers", capture::Role::network, channel(5, false), {}, false},
    };
    for (const auto& each : cases) {
        CallScript script(each.role);
        script.at(0).us(m::setup, 9, false, {bearerSpeech(), each.asked});
        script.at(100).peer(m::callProceeding, 9, true, {each.answered});
        script.at(200).peer(m::alerting, 9, true);  // the first answer is told, and no other
        EXPECT_EQ(findingsOf(script, 1000), each.missing ? "2 element-absent\n" : "") << each.says;
    }
}

TEST(CallFindings, FindAStatusOfTheGlobalReferenceThatTellsOfAnError) {
    for (const auto& [value, found] : {std::pair<std::uint8_t, std::string>{30, ""},
                                       {97, "2 element-ignored\n"},
                                       {98, "2 protocol-error\n"},
                                       {101, "2 protocol-error\n"},
                                       {81, "2 protocol-error\n"}}) {
        CallScript script;
        script.at(0).us(m::restart, 0, false, {channel(1), restartIndicator(0)});
        script.peer(m::status, 0, true, {cause(value), callState(0)});
        EXPECT_EQ(findingsOf(script, 1000), found) << int{value};
    }
}

TEST(CallFindings, NoteAnyAnswerThatWaitedForMoreDigits) {
    for (const std::uint8_t answer : {m::callProceeding, m::alerting, m::connect, m::progress}) {
        CallScript script;
        script.at(0).us(m::setup, 9, false, {bearerSpeech(), called("1")});
        script.at(20).peer(m::setupAcknowledge, 9, true, {channel(3)});
        script.at(2000).us(m::information, 9, false, {called("2")});
        script.at(14000).peer(answer, 9, true, {progress(2)});
        script.at(14500).peer(m::releaseComplete, 9, true, {cause(17)});
        EXPECT_EQ(findingsOf(script, 16000), "4 waits-for-digits\n") << int{answer};
    }
}

}  // namespace calls
