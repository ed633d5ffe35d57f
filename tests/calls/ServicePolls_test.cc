#include "calls/ServicePolls.h"

#include <gtest/gtest.h>

#include "calls/DChannel.h"
#include "tests/calls/CallScript.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

const Bytes inService{0x01, 0x01, 0xC0}, outOfService{0x01, 0x01, 0xC2};

void service(CallScript& script, std::int64_t at, const Bytes& status, std::uint8_t number,
             std::int64_t answersAfter = 20) {
    script.at(at).maintenance(Side::us, m::service, false, {status, channel(number)});
    script.at(at + answersAfter)
        .maintenance(Side::peer, m::serviceAcknowledge, true, {status, channel(number)});
}

// The numbers of the frames that are polls, and "poll<answer" for those that are answered.
std::string polls(const CallScript& script) {
    DChannel channel;
    std::string words;
    for (const Sent& sent : script.frames()) {
        const Marks& marks = channel.take(sent.frame, sent.number, sent.at);
        if (marks.answers)
            words += std::to_string(*marks.answers) + "<" + std::to_string(sent.number) + " ";
        else if (marks.keepAlive)
            words += std::to_string(sent.number) + " ";
    }
    return words;
}

}  // namespace

TEST(ServicePolls, RepeatWhatTheSideSaidOfTheChannelLast) {
    CallScript script;
    service(script, 0, inService, 5);
    service(script, 60000, inService, 5);
    service(script, 120000, inService, 6);
    service(script, 180000, inService, 5);
    EXPECT_EQ(polls(script), "3 3<4 7 7<8 ");
}

TEST(ServicePolls, AreNoChangesBackAndForth) {
    CallScript script;
    service(script, 0, inService, 5);
    service(script, 60000, outOfService, 5);
    service(script, 120000, inService, 5);
    EXPECT_EQ(polls(script), "");
}

TEST(ServicePolls, AreNotAnsweredTooLateAndNotByTheirOwnSide) {
    CallScript script;
    service(script, 0, inService, 5);
    service(script, 60000, inService, 5, 1100);
    script.at(120000).maintenance(Side::us, m::service, false, {inService, channel(5)});
    script.at(120010).maintenance(Side::us, m::serviceAcknowledge, true, {inService, channel(5)});
    EXPECT_EQ(polls(script), "3 5 ");
}

TEST(ServicePolls, AreNoFramesThatTheLinkSendsAgain) {
    CallScript script;
    service(script, 0, inService, 5);
    script.at(1000).again(0);
    EXPECT_EQ(polls(script), "");
}

TEST(ServicePolls, AreNoFramesThatWaitBehindAHole) {
    CallScript script;
    const auto say = [&] { script.maintenance(Side::peer, m::service, false, {inService, channel(5)}); };
    say();
    script.maintenance(Side::peer, m::service, false, {inService, channel(6)}).unrecorded();
    say();
    EXPECT_EQ(polls(script), "");
}

// Maintenance is signalled in I frames. What stands in a UI frame is worth seeing.
TEST(ServicePolls, AreNoUnnumberedFrames) {
    CallScript script;
    for (int i = 0; i < 2; ++i)
        script.at(i * 60000).raw(Side::us, true, {0x03, 0x03, 0x02, 0, 0, m::service, 0x01, 0x01, 0xC0});
    EXPECT_EQ(polls(script), "");
}

TEST(ServicePolls, AreNoMessagesOfCallControlWithTheSameCode) {
    static_assert(m::connectAcknowledge == m::service);
    CallScript script;
    for (int i = 0; i < 2; ++i)
        script.at(i * 60000).us(m::connectAcknowledge, 7, false);
    EXPECT_EQ(polls(script), "");
}

}  // namespace calls
