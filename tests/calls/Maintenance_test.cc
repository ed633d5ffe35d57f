#include "calls/Maintenance.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "tests/calls/analysed.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

CallScript afterACall() {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech()});
    script.at(5).peer(m::releaseComplete, 1, true, {cause(17)});
    return script;
}

CallScript& restart(CallScript& script, std::uint8_t number, bool acknowledged = true) {
    script.us(m::restart, 0, false, {channel(number), restartIndicator(0)});
    if (acknowledged)
        script.peer(m::restartAcknowledge, 0, true, {channel(number), restartIndicator(0)});
    return script;
}

const Bytes outOfService{0x01, 0x01, 0xC2};

// What is found while the trace goes on, so many milliseconds behind the last frame.
std::string foundSoFar(const CallScript& script, std::int64_t quiet) {
    Collected collected;
    Analysis analysis({}, collected);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames())
        analysis.take(sent.frame, ++number);
    analysis.advance(quiet * millisecond);
    analysis.advance(1);
    return collected.lines;
}

// "4 restart-unacknowledged x30: RESTARTs of us got no ...", a line for each finding.
std::string toldIn(const CallScript& script, std::int64_t quiet) {
    Collected collected;
    analyse(script, collected, quiet);
    std::string lines;
    for (const Finding& finding : collected.findings)
        lines += std::to_string(finding.frame) + " " + std::string(finding.kind->id) + " x" +
                 std::to_string(finding.count) + ": " + finding.sentence + "\n";
    return lines;
}

}  // namespace

TEST(Maintenance, FindsARestartWithoutAcknowledgeAfterItsRepetition) {
    CallScript script = afterACall();
    restart(script.at(1000), 5, false);
    restart(script.at(121000), 5, false);
    EXPECT_EQ(findingsIn(script, 119900), "");
    EXPECT_EQ(findingsIn(script, 120100), "4 cannot-be-told\n");  // nobody has acknowledged the frame either
    script.at(122000).peer(m::information, 9, true);
    EXPECT_EQ(findingsIn(script, 119100), "4 restart-unacknowledged\n");
}

TEST(Maintenance, TellsRestartsThatWaitTogetherAsOneFinding) {
    CallScript script = afterACall();
    for (std::uint8_t number = 1; number <= 5; ++number)
        restart(script.at(1000 + number * 20), number, number == 3);
    script.at(2000).acknowledge(Side::peer).acknowledge(Side::us);
    EXPECT_EQ(toldIn(script, 238900), "");
    EXPECT_EQ(toldIn(script, 240000),
              "3 restart-unacknowledged x4: RESTARTs of us got no acknowledge: channels 1, 2, 4, 5\n");
}

TEST(Maintenance, TellsTheRestartsOfTheTwoSidesApart) {
    CallScript script = afterACall();
    for (std::uint8_t number = 1; number <= 2; ++number) {
        script.at(1000 + number * 20).us(m::restart, 0, false, {channel(number), restartIndicator(0)});
        script.peer(m::restart, 0, false, {channel(number), restartIndicator(0)});
    }
    script.at(2000).acknowledge(Side::peer).acknowledge(Side::us);
    EXPECT_EQ(toldIn(script, 240000),
              "3 restart-unacknowledged x2: RESTARTs of us got no acknowledge: channels 1, 2\n"
              "4 restart-unacknowledged x2: RESTARTs of the peer got no acknowledge: channels 1, 2\n");
}

TEST(Maintenance, FindsARestartThatIsRepeatedForEver) {
    CallScript script = afterACall();
    for (int minute = 0; minute < 60; ++minute) {
        restart(script.at(1000 + minute * 60000), 5, false);
        script.acknowledge(Side::peer);
    }
    // After four minutes the answer to the first one is overdue; then once in ten minutes at most.
    const std::string told = toldIn(script, 0);
    EXPECT_TRUE(
        told.starts_with("11 restart-unacknowledged x1: RESTART of frame 3 got no acknowledge: channel 5\n"))
        << told;
    const auto findings = std::count(told.begin(), told.end(), '\n');
    EXPECT_GE(findings, 2) << told;
    EXPECT_LE(findings, 7) << told;
}

TEST(Maintenance, TellsAStormThatPassesOverTheChannelsAsOneFinding) {
    CallScript script = afterACall();
    for (int round = 0; round < 4; ++round) {
        for (std::uint8_t number = 1; number <= 30; ++number)
            restart(script.at(1000 + round * 60000 + number * 20), number);
    }
    const std::string told = toldIn(script, 0);
    EXPECT_TRUE(told.starts_with("183 restart-storm x30: channels 1, 2, 3, 4, ")) << told;
    EXPECT_TRUE(told.ends_with(", 29, 30 were restarted more than 3 times in 10 minutes by us\n")) << told;
    EXPECT_EQ(toldIn(script, 11000), told);
}

TEST(Maintenance, TellsServicesThatWaitTogetherAsOneFinding) {
    CallScript script = afterACall();
    script.at(500).maintenance(Side::us, m::service, false, {outOfService, channel(3)});
    script.at(510).maintenance(Side::peer, m::serviceAcknowledge, true, {outOfService, channel(3)});
    for (int time = 0; time < 2; ++time) {
        for (std::uint8_t number = 4; number <= 6; ++number)
            script.at(1000 + time * 60000 + number)
                .maintenance(Side::us, m::service, false, {outOfService, channel(number)});
    }
    script.at(62000).acknowledge(Side::peer);
    EXPECT_EQ(toldIn(script, 70000),
              "8 service-unacknowledged x3: SERVICEs of us got no acknowledge: channels 4, 5, 6\n");
}

TEST(Maintenance, TellsAtOnceWhenOnlyThoseStillWaitThatBelongToAnotherFinding) {
    CallScript script = afterACall();
    script.at(500).maintenance(Side::us, m::service, false, {outOfService, channel(3)});
    script.at(510).maintenance(Side::peer, m::serviceAcknowledge, true, {outOfService, channel(3)});
    script.at(900).maintenance(Side::us, m::service, false, {outOfService, channel(7)});  // not repeated
    script.at(950).maintenance(Side::peer, m::service, false, {outOfService, channel(9)});
    script.at(960).maintenance(Side::peer, m::service, false, {outOfService, channel(9)});
    for (const int time : {1000, 61000})
        script.at(time).maintenance(Side::us, m::service, false, {outOfService, channel(4)});
    restart(script.at(62000), 6, false).acknowledge(Side::peer);
    script.at(122000).acknowledge(Side::peer).acknowledge(Side::us);
    EXPECT_EQ(foundSoFar(script, 100), "9 service-unacknowledged\n");
    CallScript later = afterACall();
    restart(later.at(1000), 5, false).acknowledge(Side::peer);
    later.at(241010).acknowledge(Side::peer).acknowledge(Side::us);
    restart(later.at(241012), 6, false);  // the first one is overdue already
    later.at(241020).acknowledge(Side::peer);
    EXPECT_EQ(foundSoFar(later, 100), "3 restart-unacknowledged\n");
}

TEST(Maintenance, TakesARestartOfEachChannelForSound) {
    CallScript script = afterACall();
    for (std::uint8_t number = 1; number < 31; ++number)
        restart(script.at(1000 + number * 20), number);
    EXPECT_EQ(findingsIn(script, 300000), "");
}

TEST(Maintenance, FindsAStormOfRestarts) {
    CallScript script = afterACall();
    for (int i = 0; i < 3; ++i)
        restart(script.at(1000 + i * 60000), 5);
    EXPECT_EQ(findingsIn(script), "");
    restart(script.at(200000), 5);
    EXPECT_EQ(findingsIn(script), "9 restart-storm\n");
}

TEST(Maintenance, TakesTheTwoDirectionsOfRestartApart) {
    CallScript script = afterACall();
    script.at(1000).us(m::restart, 0, false, {restartIndicator(7)});
    script.at(1010).peer(m::restart, 0, false, {restartIndicator(7)});
    script.at(1020).us(m::restartAcknowledge, 0, true, {restartIndicator(7)});
    script.at(1030).us(m::information, 9, false);
    script.at(1040).peer(m::information, 9, true);
    EXPECT_EQ(findingsIn(script, 300000), "3 restart-unacknowledged\n");
}

TEST(Maintenance, NotesAnAcknowledgeThatListsFewerChannels) {
    CallScript script = afterACall();
    const Bytes two{0x18, 0x04, 0xA9, 0x83, 0x05, 0x86};  // channels 5 and 6
    script.at(1000).us(m::restart, 0, false, {two, restartIndicator(0)});
    script.at(1010).peer(m::restartAcknowledge, 0, true, {channel(5), restartIndicator(0)});
    EXPECT_EQ(findingsIn(script, 300000), "4 restart-partly\n");
}

TEST(Maintenance, FindsAServiceThatIsNotAcknowledgedOnlyWhereOthersWere) {
    for (const bool others : {false, true}) {
        CallScript script = afterACall();
        if (others) {
            script.at(500).maintenance(Side::us, m::service, false, {outOfService, channel(3)});
            script.at(510).maintenance(Side::peer, m::serviceAcknowledge, true, {outOfService, channel(3)});
        }
        script.at(1000).maintenance(Side::us, m::service, false, {outOfService, channel(4)});
        script.at(61000).maintenance(Side::us, m::service, false, {outOfService, channel(4)});
        script.at(62000).peer(m::information, 9, true);
        EXPECT_EQ(findingsIn(script, 70000), others ? "6 service-unacknowledged\n" : "");
    }
}

TEST(Maintenance, TakesNoServiceThatSaysAnotherStatusForARepetition) {
    CallScript script = afterACall();
    script.at(500).maintenance(Side::us, m::service, false, {outOfService, channel(3)});
    script.at(510).maintenance(Side::peer, m::serviceAcknowledge, true, {outOfService, channel(3)});
    script.at(1000).maintenance(Side::us, m::service, false, {outOfService, channel(4)});
    script.at(61000).maintenance(Side::us, m::service, false, {Bytes{0x01, 0x01, 0xC0}, channel(4)});
    script.at(62000).peer(m::information, 9, true);
    EXPECT_EQ(findingsIn(script, 200000), "");
}

}  // namespace calls
