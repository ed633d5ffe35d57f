#include "calls/Channels.h"

#include <gtest/gtest.h>

#include "calls/FindingKinds.h"
#include "tests/calls/analysed.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

// A call of our side on a channel, answered; nothing clears it.
CallScript& talk(CallScript& script, std::uint16_t ref, std::uint8_t number) {
    script.us(m::setup, ref, false, {bearerSpeech(), channel(number)});
    script.peer(m::callProceeding, ref, true, {channel(number)});
    script.peer(m::connect, ref, true);
    return script.us(m::connectAcknowledge, ref, false);
}

CallScript& clear(CallScript& script, std::uint16_t ref) {
    script.us(m::disconnect, ref, false, {cause(16)});
    script.peer(m::release, ref, true);
    return script.us(m::releaseComplete, ref, false);
}

}  // namespace

TEST(Channels, AreFreeForTheNextCallOnceTheLastHasEnded) {
    CallScript script;
    talk(script.at(0), 1, 30);
    clear(script.at(5000), 1);
    talk(script.at(5100), 2, 30);
    EXPECT_EQ(findingsIn(script, 1000), "");
}

TEST(Channels, GivenToTwoCallsAreFound) {
    CallScript script;
    talk(script.at(0), 1, 30);
    talk(script.at(5000), 2, 30);
    EXPECT_EQ(findingsIn(script, 1000), "6 double-seizure\n");
}

TEST(Channels, AreHeldByCallsThatBeganBeforeTheTrace) {
    CallScript script;
    script.at(0).peer(m::connect, 1, true, {channel(30)}).us(m::connectAcknowledge, 1, false);
    talk(script.at(5000), 2, 30);
    EXPECT_EQ(findingsIn(script, 1000), "4 double-seizure\n");
}

TEST(Channels, AreNotTakenByAnAnswerThatComesAfterTheEndOfItsCall) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech(), channel(30)});
    script.at(10).us(m::release, 1, false, {cause(16)}).peer(m::releaseComplete, 1, true);
    script.at(14).peer(m::callProceeding, 1, true, {channel(30)});
    talk(script.at(1000), 2, 30);
    EXPECT_EQ(findingsIn(script, 1000), "");
}

TEST(Channels, MayBeGivenAwayJustBeforeTheOldCallIsSeenToEnd) {
    CallScript script;
    talk(script.at(0), 1, 30);
    script.at(5000).us(m::disconnect, 1, false, {cause(16)});
    script.at(5010).peer(m::release, 1, true);
    script.at(5012).us(m::setup, 2, false, {bearerSpeech(), channel(30)});
    script.at(5016).peer(m::callProceeding, 2, true, {channel(30)});
    script.at(5020).us(m::releaseComplete, 1, false);
    EXPECT_EQ(findingsIn(script, 1000), "");
}

TEST(Channels, AreFreeWhileTheirCallIsOnHold) {
    CallScript script;
    talk(script.at(0), 1, 30);
    script.at(3000).us(m::hold, 1, false);
    script.at(3010).peer(m::holdAcknowledge, 1, true);
    talk(script.at(4000), 2, 30);
    EXPECT_EQ(findingsIn(script, 1000), "");
}

TEST(Channels, ThatBothSidesTakeAtOnceAreANoteIfOneGivesWay) {
    CallScript script;
    script.at(0).crossing();
    script.us(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.peer(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.at(20).us(m::callProceeding, 1, true, {channel(5)});
    script.at(30).peer(m::releaseComplete, 1, true, {cause(44)});
    EXPECT_EQ(findingsIn(script), "4 glare\n");
}

TEST(Channels, ThatBothSidesTakeAtOnceAreANoteIfOneIsMoved) {
    CallScript script;
    script.at(0).crossing();
    script.us(m::setup, 1, false, {bearerSpeech(), channel(5, false)});
    script.peer(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.at(20).us(m::callProceeding, 1, true, {channel(5)});
    script.at(30).peer(m::callProceeding, 1, true, {channel(6)});
    EXPECT_EQ(findingsIn(script), "4 glare\n");
}

TEST(Channels, ThatBothSidesTakeAndKeepAreAWarning) {
    CallScript script;
    script.at(0).crossing();
    script.us(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.peer(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.at(20).us(m::callProceeding, 1, true, {channel(5)});
    script.at(30).peer(m::callProceeding, 1, true, {channel(5)});
    EXPECT_EQ(findingsIn(script, 100), "4 glare-persists\n");
}

TEST(Channels, AreNoGlareIfTheSecondSideHadSeenTheFirst) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.at(10).peer(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.at(20).us(m::releaseComplete, 1, true, {cause(44)});
    EXPECT_EQ(findingsIn(script), "");
}

// The other side had seen the first SETUP, and answers it late.
TEST(Channels, AreNoGlareBecauseASetupIsRepeated) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech(), channel(5)}).acknowledge(Side::peer);
    script.at(3900).crossing().us(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.peer(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.at(3920).us(m::releaseComplete, 1, true, {cause(44)});
    EXPECT_EQ(findingsIn(script), "3 setup-repeated\n");
}

// The numbers of different links say nothing about each other.
TEST(Channels, AreNoGlareBetweenTwoTerminals) {
    for (const std::uint8_t tei : {64, 65}) {
        CallScript script(capture::Role::network);
        script.at(0).tei(64).crossing().peer(m::setup, 1, false, {bearerSpeech(), channel(1)});
        script.tei(tei).us(m::setup, 1, false, {bearerSpeech(), channel(1)});
        script.at(20).tei(64).us(m::releaseComplete, 1, true, {cause(44)});
        EXPECT_EQ(findingsIn(script), tei == 64 ? "3 glare\n" : "");
    }
}

// The answer to our SETUP is missing, and numbers have come so far that N(R) lies behind it.
TEST(Channels, AreNoGlareLongAfterTheFirstSetup) {
    for (const bool late : {false, true}) {
        CallScript script;
        script.at(0).crossing();
        script.us(m::setup, 1, false, {bearerSpeech(), channel(5)});
        script.at(late ? 4004 : 4000).peer(m::setup, 1, false, {bearerSpeech(), channel(5)});
        script.at(4020).us(m::releaseComplete, 1, true, {cause(44)});
        EXPECT_EQ(findingsIn(script), late ? "" : "3 glare\n");
    }
}

TEST(Channels, RefusedAlthoughIdleAreAWarningAndTheSecondTimeStuck) {
    CallScript script;
    talk(script.at(0), 1, 30);
    clear(script.at(1000), 1);
    script.at(2000).us(m::setup, 2, false, {bearerSpeech(), channel(30)});
    script.at(2010).peer(m::releaseComplete, 2, true, {cause(44)});
    script.at(3000).us(m::setup, 3, false, {bearerSpeech(), channel(30)});
    script.at(3010).peer(m::releaseComplete, 3, true, {cause(44)});
    EXPECT_EQ(findingsIn(script), "9 channel-refused-idle\n11 stuck-channel\n");
}

TEST(Channels, ThatACallMayHaveTakenUnseenAreNotKnownToBeIdle) {
    for (const bool lost : {false, true}) {
        CallScript script;
        talk(script.at(0), 1, 30);
        clear(script.at(1000), 1);
        script.at(1500).peer(m::setup, 1, false, {bearerSpeech(), channel(30)});
        script.us(m::releaseComplete, 1, true, {cause(17)});
        if (lost)
            script.at(1800).us(m::setup, 7, false, {bearerSpeech(), channel(30)}).unrecorded();
        script.at(2000).us(m::setup, 2, false, {bearerSpeech(), channel(30)});
        script.at(2010).peer(m::releaseComplete, 2, true, {cause(44)});
        EXPECT_EQ(findingsIn(script), lost ? "10 ns-gap-recorder\n" : "11 channel-refused-idle\n");
    }
}

TEST(Channels, RefusedWhileNothingIsKnownOfThemAreNoFinding) {
    CallScript script;
    script.at(2000).us(m::setup, 2, false, {bearerSpeech(), channel(30)});
    script.at(2010).peer(m::releaseComplete, 2, true, {cause(44)});
    EXPECT_EQ(findingsIn(script), "");
}

TEST(Channels, WhoseCallWasReplacedAreStuckUntilTheyAreRestarted) {
    CallScript script;
    talk(script.at(0), 1, 30);
    script.at(5000).us(m::setup, 1, false, {bearerSpeech(), channel(29)});
    script.at(5010).peer(m::releaseComplete, 1, true, {cause(17)});
    EXPECT_EQ(findingsIn(script), "5 reference-in-use\n5 stuck-channel\n");
    script.at(9000).us(m::restart, 0, false, {channel(30), restartIndicator(0)});
    script.at(9010).peer(m::restartAcknowledge, 0, true, {channel(30), restartIndicator(0)});
    EXPECT_EQ(findingsIn(script), "5 reference-in-use\n");
}

// The recorder says that it was started again, twice, and later the reference and the channel of the first
// call are taken by others, while nothing answers what was asked before.
TEST(Channels, AreHeldByNobodyAfterTheBoardRestarted) {
    CallScript script;
    talk(script.at(0).linkUp(), 1, 30);
    talk(script, 2, 29);
    script.at(2000).us(m::disconnect, 2, false, {cause(16)}).acknowledge(Side::peer);
    const std::size_t before = script.frames().size();
    script.at(60000).linkUp();
    talk(script, 3, 30);
    talk(script.at(70000), 1, 28);
    Collected collected;
    Analysis analysis({}, collected);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames()) {
        analysis.take(sent.frame, ++number);
        if (number == before) {
            analysis.restarted(*sent.frame.interface);
            analysis.restarted(*sent.frame.interface);
        }
    }
    analysis.advance(300 * second);
    analysis.finish();
    EXPECT_EQ(collected.lines, std::to_string(before) + " board-restarted\n");
}

TEST(Channels, OfALongCallOrThatNobodyUsesAreNeverStuck) {
    CallScript script;
    talk(script.at(0), 1, 30);
    EXPECT_EQ(findingsIn(script, std::int64_t{3} * 86400 * 1000), "");
}

TEST(Channels, OutOfServiceAreNotToBeTaken) {
    CallScript script;
    const Bytes outOfService{0x01, 0x01, 0xC2}, inService{0x01, 0x01, 0xC0};
    script.at(0).maintenance(Side::peer, m::service, false, {outOfService, channel(7)});
    script.at(10).maintenance(Side::us, m::serviceAcknowledge, true, {outOfService, channel(7)});
    script.at(20).us(m::setup, 1, false, {bearerSpeech(), channel(7)});
    script.at(30).peer(m::releaseComplete, 1, true, {cause(44)});
    EXPECT_EQ(findingsIn(script), "3 channel-out-of-service\n");
    script.at(40).maintenance(Side::peer, m::service, false, {inService, channel(7)});
    script.at(50).maintenance(Side::us, m::serviceAcknowledge, true, {inService, channel(7)});
    talk(script.at(60), 2, 7);
    EXPECT_EQ(findingsIn(script), "3 channel-out-of-service\n");
}

TEST(Channels, TakenInOneOrderByBothSidesAreProneToGlare) {
    for (const bool peerGoesDown : {false, true}) {
        CallScript script;
        for (std::uint16_t i = 0; i < 25; ++i) {
            const auto up = static_cast<std::uint8_t>(1 + i);
            const auto down = static_cast<std::uint8_t>(31 - i);
            script.at(i * 1000).us(m::setup, i + 1, false, {bearerSpeech(), channel(up)});
            script.peer(m::releaseComplete, i + 1, true, {cause(17)});
            script.at(i * 1000 + 500);
            script.peer(m::setup, i + 1, false, {bearerSpeech(), channel(peerGoesDown ? down : up)});
            script.us(m::releaseComplete, i + 1, true, {cause(17)});
        }
        EXPECT_EQ(findingsIn(script), peerGoesDown ? "" : "83 glare-prone\n");
    }
}

// Both sides take channels so many times upwards, and then downwards.
TEST(Channels, AreProneToGlareFromTwentySetupsOfWhichFourInFiveGoOneWay) {
    struct {
        unsigned up, down;
        bool prone;
    } const cases[] = {{19, 0, false}, {20, 0, true}, {16, 4, true}, {15, 5, false},
                       {0, 19, false}, {0, 20, true}, {4, 16, true}, {5, 15, false}};
    for (const auto& each : cases) {
        CallScript script;
        auto number = static_cast<std::uint8_t>(each.up > each.down ? 5 : 25);
        for (std::uint16_t i = 0; i <= each.up + each.down; ++i) {
            if (i > 0)
                number = static_cast<std::uint8_t>(i <= each.up ? number + 1 : number - 1);
            for (const Side side : {Side::us, Side::peer}) {
                script.at(i * 1000 + (side == Side::us ? 0 : 500));
                script.message(side, m::setup, i + 1, false, {bearerSpeech(), channel(number)});
                script.message(other(side), m::releaseComplete, i + 1, true, {cause(17)});
            }
        }
        EXPECT_EQ(findingsIn(script), each.prone ? "83 glare-prone\n" : "") << each.up << " up";
    }
}

TEST(Channels, ThatAreOutOfServiceAreFoundInTheAnswerToo) {
    for (const bool faulty : {false, true}) {
        CallScript script;
        const Bytes outOfService{0x01, 0x01, 0xC2};
        script.at(0).maintenance(Side::peer, m::service, false, {outOfService, channel(7)});
        script.maintenance(Side::us, m::serviceAcknowledge, true, {outOfService, channel(7)});
        script.at(1000).us(m::setup, 1, false, {bearerSpeech()});
        script.peer(m::callProceeding, 1, true, {channel(faulty ? 7 : 8)});
        script.peer(m::alerting, 1, true, {channel(faulty ? 7 : 8)});
        EXPECT_EQ(findingsIn(script), faulty ? "4 channel-out-of-service\n" : "");
    }
}

TEST(Channels, RefusedByTheUserWithCause34AreFoundIfTheyAreIdle) {
    for (const bool idle : {false, true}) {
        CallScript script(capture::Role::network);
        talk(script.at(0), 1, 30);
        if (idle)
            clear(script.at(2000), 1);
        script.at(5000).us(m::setup, 2, false, {bearerSpeech(), channel(30)});
        script.peer(m::releaseComplete, 2, true, {cause(34)});
        EXPECT_EQ(findingsIn(script), idle ? "9 channel-refused-idle\n" : "");
    }
}

TEST(Channels, ThatStayBehindWithALinkStandInItsFinding) {
    for (const bool restarted : {false, true}) {
        CallScript script;
        script.at(0).linkUp();
        for (std::uint8_t i = 1; i <= 3; ++i)
            talk(script.at(i * 1000), i, i);
        script.at(9000).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
        script.at(200000).linkUp();
        for (std::uint8_t i = 1; restarted && i <= 3; ++i) {
            script.us(m::restart, 0, false, {channel(i), restartIndicator(0)});
            script.peer(m::restartAcknowledge, 0, true, {channel(i), restartIndicator(0)});
        }
        Collected collected;
        analyse(script, collected, 300000);
        EXPECT_EQ(collected.lines, "16 mass-clear\n");
        ASSERT_EQ(collected.findings.size(), 1U);
        const std::vector<std::string> stuck{"1", "2", "3"};
        EXPECT_EQ(collected.findings[0].channels, restarted ? std::vector<std::string>() : stuck);
        EXPECT_EQ(collected.findings[0].severity, Severity::error);
    }
}

TEST(Channels, ThatStayBehindWithALinkShareAFindingOfTheirOwnIfTheCallsAreFew) {
    CallScript script;
    script.at(0).linkUp();
    for (std::uint8_t i = 1; i <= 2; ++i)
        talk(script.at(i * 1000), i, i);
    script.at(9000).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
    script.at(200000).linkUp();
    Collected collected;
    analyse(script, collected, 300000);
    ASSERT_EQ(collected.findings.size(), 1U) << collected.lines;
    EXPECT_EQ(collected.findings[0].kind, &findings::stuckChannel);
    EXPECT_EQ(collected.findings[0].channels, (std::vector<std::string>{"1", "2"}));
    EXPECT_EQ(collected.findings[0].sentence,
              "channels 1, 2 of calls 1, 2 were neither cleared nor restarted after the link was lost");
}

TEST(Channels, OfOneInterfaceAreFreeAfterARestartOfThatInterface) {
    const auto on = [](std::uint8_t interface, std::uint8_t number) {
        return Bytes{0x18, 0x04,
                     0xE9, static_cast<std::uint8_t>(0x80 | interface),
                     0x83, static_cast<std::uint8_t>(0x80 | number)};
    };
    const Bytes wholeInterface{0x18, 0x02, 0xE8, 0x81};  // 1, and no channel
    CallScript script;
    script.at(0).linkUp();
    for (const std::uint8_t interface : {0, 1}) {
        const auto reference = static_cast<std::uint16_t>(interface + 1);
        script.at(1000 + interface * 2000).us(m::setup, reference, false, {bearerSpeech(), on(interface, 5)});
        script.peer(m::connect, reference, true, {on(interface, 5)});
        script.at(2000 + interface * 2000)
            .us(m::setup, reference, false, {bearerSpeech()});  // takes the reference of a live call
        script.peer(m::releaseComplete, reference, true, {cause(17)});
    }
    script.at(9000).us(m::restart, 0, false, {wholeInterface, restartIndicator(6)});
    script.peer(m::restartAcknowledge, 0, true, {wholeInterface, restartIndicator(6)});
    Collected collected;
    analyse(script, collected);
    std::vector<std::string> stuck;
    for (const Finding& finding : collected.findings) {
        if (finding.kind == &findings::stuckChannel)
            stuck.insert(stuck.end(), finding.channels.begin(), finding.channels.end());
    }
    EXPECT_EQ(stuck, std::vector<std::string>{"0/5"}) << collected.lines;
}

TEST(Channels, ThatStayBehindAreAnErrorThoughTheLinkHasOneOfItsOwn) {
    for (const bool restarted : {false, true}) {
        CallScript script;
        script.at(0).linkUp();
        for (std::uint8_t i = 1; i <= 3; ++i)
            talk(script.at(i * 1000), i, i);
        script.at(9000).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
        for (int i = 0; i < 4; ++i)
            script.at(10000 + i * 1000).raw(Side::us, true, {0x7F});  // SABME that nobody answers
        script.at(200000).linkUp();
        for (std::uint8_t i = 1; restarted && i <= 3; ++i) {
            script.us(m::restart, 0, false, {channel(i), restartIndicator(0)});
            script.peer(m::restartAcknowledge, 0, true, {channel(i), restartIndicator(0)});
        }
        Collected collected;
        analyse(script, collected, 500000);
        ASSERT_EQ(collected.findings.size(), 2U) << collected.lines;
        EXPECT_EQ(collected.findings[0].kind, &findings::sabmeUnanswered);
        EXPECT_EQ(collected.findings[0].severity, Severity::error);
        EXPECT_EQ(collected.findings[1].kind, &findings::massClear);
        EXPECT_EQ(collected.findings[1].severity, restarted ? Severity::note : Severity::error);
    }
}

}  // namespace calls
