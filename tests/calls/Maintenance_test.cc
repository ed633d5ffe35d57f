#include "calls/Maintenance.h"

#include <gtest/gtest.h>

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

}  // namespace calls
