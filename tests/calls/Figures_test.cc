#include "calls/Figures.h"

#include <gtest/gtest.h>

#include <limits>

#include "tests/calls/CallScript.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

// The figures of a script.
class Counted : public Listener {
  public:
    enum class Ticks { kept, dropped };

    explicit Counted(const CallScript& script, std::int64_t quiet = 0, Ticks ticks = Ticks::kept) {
        Analysis analysis({}, *this);
        std::uint64_t number = 0;
        for (const Sent& sent : script.frames()) {
            capture::Frame frame = sent.frame;
            if (ticks == Ticks::dropped)
                frame.ticks.reset();
            analysis.take(frame, ++number);
        }
        analysis.advance(quiet * millisecond);
        analysis.finish();
        occupancy.finish(analysis.spans());
    }
    void heard(const Message& message, const Call* call) override {
        figures.heard(message);
        if (call != nullptr)
            occupancy.heard(message, *call);
    }
    void ended(const Call& call) override { occupancy.ended(call); }
    void gone(const Call& call) override { figures.gone(call); }
    void found(const Finding& finding) override { occupancy.found(finding); }

    const Occupancy::Group& group() const { return occupancy.groups().begin()->second; }
    const Occupancy::Channel& channel(std::uint32_t number) const {
        return group().channels.at({std::nullopt, number});
    }

    Figures figures;
    Occupancy occupancy;
};

void call(CallScript& script, std::int64_t begin, std::uint16_t ref, std::uint8_t number,
          std::int64_t length) {
    script.at(begin).us(m::setup, ref, false, {bearerSpeech(), channel(number)});
    script.at(begin + 40).peer(m::callProceeding, ref, true, {channel(number)});
    script.at(begin + 400).peer(m::alerting, ref, true);
    script.at(begin + 1000).peer(m::connect, ref, true);
    script.at(begin + 1010).us(m::connectAcknowledge, ref, false);
    script.at(begin + 1000 + length).us(m::disconnect, ref, false, {cause(16)});
    script.at(begin + 1020 + length).peer(m::release, ref, true);
    script.at(begin + 1040 + length).us(m::releaseComplete, ref, false);
}

void refused(CallScript& script, std::int64_t begin, std::uint16_t ref, std::uint8_t value) {
    script.at(begin).us(m::setup, ref, false, {bearerSpeech()});
    script.at(begin + 20).peer(m::releaseComplete, ref, true, {cause(value, 2)});
}

}  // namespace

TEST(Figures, CountMessagesOfEachSide) {
    CallScript script;
    call(script, 0, 1, 5, 3000);
    script.at(9000).maintenance(Side::us, m::service, false, {Bytes{0x01, 0x01, 0xC0}, channel(3)});
    const Counted counted(script);
    const auto& messages = counted.figures.messages();
    using Sides = std::array<std::uint64_t, 2>;
    EXPECT_EQ(messages.at({isdn::callControl, true, false, m::setup}), (Sides{1, 0}));
    EXPECT_EQ(messages.at({isdn::callControl, true, false, m::release}), (Sides{0, 1}));
    EXPECT_EQ(messages.at({isdn::maintenance, true, false, m::service}), (Sides{1, 0}));
}

TEST(Figures, TellTheFirstCauseFromLaterOnes) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech()});
    script.at(20).peer(m::progress, 1, true, {cause(31, 2), progress(8)});
    script.at(40).peer(m::disconnect, 1, true, {cause(17, 0)});
    script.at(60).us(m::release, 1, false, {cause(16, 0)});
    script.at(80).peer(m::releaseComplete, 1, true);
    script.at(100).us(m::setup, 2, false, {bearerSpeech()});
    script.at(120).peer(m::releaseComplete, 2, true);
    const Counted counted(script);
    const auto& causes = counted.figures.causes();
    ASSERT_EQ(causes.size(), 3U);
    const CauseKey busy{0, 17, 0, Side::peer, capture::Role::network, Made::farUser};
    const CauseKey normal{0, 16, 0, Side::us, capture::Role::user, Made::here};
    const CauseKey announced{0, 31, 2, Side::peer, capture::Role::network, Made::thisExchange};
    EXPECT_EQ(causes.at(busy).first, 1U);
    EXPECT_EQ(causes.at(normal).first, 0U);
    EXPECT_EQ(causes.at(normal).later, 1U);
    EXPECT_EQ(causes.at(announced).before, 1U);
    EXPECT_EQ(counted.figures.withoutCause(), 1U);
}

TEST(Figures, GiveTheTimesOfCalls) {
    CallScript script;
    for (std::uint16_t i = 0; i < 20; ++i)
        call(script, i * 10000, i + 1, 5, 1000 * (i + 1));
    const Counted counted(script);
    const auto durations = [&](std::string_view name) {
        std::size_t i = 0;
        while (measures()[i].name != name)
            ++i;
        EXPECT_EQ(counted.figures.times(i, Side::peer).count(), 0U);
        return counted.figures.times(i, Side::us);
    };
    EXPECT_EQ(durations("first response").quantile(0.5), 40 * millisecond);
    EXPECT_EQ(durations("alerting").quantile(0.5), 400 * millisecond);
    EXPECT_EQ(durations("connect").longest(), 1000 * millisecond);
    EXPECT_EQ(durations("conversation").longest(), 20 * second);
    EXPECT_EQ(durations("conversation").count(), 20U);
    EXPECT_EQ(durations("clearing").quantile(0.95), 40 * millisecond);
}

TEST(Figures, GiveTheRatiosOfSeizures) {
    CallScript script;
    call(script, 0, 1, 5, 2000);
    refused(script, 5000, 2, 17);
    refused(script, 6000, 3, 34);
    refused(script, 7000, 4, 1);
    const Counted counted(script);
    const Traffic& traffic = counted.figures.traffic(Side::us);
    EXPECT_EQ(traffic.seizures, 4U);
    EXPECT_DOUBLE_EQ(*traffic.answerSeizureRatio(), 0.25);
    EXPECT_DOUBLE_EQ(*traffic.networkEffectivenessRatio(), 0.5);
    EXPECT_EQ(counted.figures.traffic(Side::peer).answerSeizureRatio(), std::nullopt);
}

TEST(Figures, CallItReachedIfTheCallerHangsUpWhileItRings) {
    for (const bool rings : {false, true}) {
        CallScript script;
        script.at(0).us(m::setup, 1, false, {bearerSpeech()});
        script.at(20).peer(rings ? m::alerting : m::callProceeding, 1, true);
        script.at(5000).us(m::disconnect, 1, false, {cause(16)});
        script.at(5020).peer(m::release, 1, true);
        script.at(5040).us(m::releaseComplete, 1, false);
        const Counted counted(script);
        EXPECT_EQ(counted.figures.traffic(Side::us).reached, rings ? 1U : 0U);
        EXPECT_EQ(counted.figures.traffic(Side::us).seizures, 1U);
    }
}

TEST(Figures, CountARepeatedSetupOnce) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech()});
    script.at(4000).us(m::setup, 1, false, {bearerSpeech()});
    script.at(4020).peer(m::releaseComplete, 1, true, {cause(17)});
    const Counted counted(script);
    EXPECT_EQ(counted.figures.traffic(Side::us).seizures, 1U);
    EXPECT_EQ(counted.figures.traffic(Side::us).setupRepeated, 1U);
}

TEST(Figures, DoNotCountTheCallThatGaveWayInAGlare) {
    CallScript script;
    script.at(0).crossing();
    script.us(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.peer(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.at(20).us(m::callProceeding, 1, true, {channel(5)});
    script.at(30).peer(m::releaseComplete, 1, true, {cause(44)});
    const Counted counted(script);
    EXPECT_EQ(counted.figures.traffic(Side::us).seizures, 0U);
    EXPECT_EQ(counted.figures.traffic(Side::us).gaveWay, 1U);
}

TEST(Figures, DoNotCountWhatTakesNoChannelOrHasNoResult) {
    CallScript script;
    const Bytes noChannel{0x18, 0x01, 0xAC};  // the D channel, no B channel
    script.at(0).us(m::setup, 1, false, {bearer64k(), noChannel});
    script.at(10).peer(m::connect, 1, true, {noChannel});
    script.at(20).us(m::releaseComplete, 1, false, {cause(16)});
    script.at(30).us(m::registration, 2, false, {Bytes{0x1C, 0x01, 0x91}});
    script.at(40).peer(m::releaseComplete, 2, true);
    script.at(50).us(m::information, 3, false);
    script.at(60).us(m::setup, 4, false, {bearerSpeech()});
    const Counted counted(script);
    const Traffic& traffic = counted.figures.traffic(Side::us);
    EXPECT_EQ(traffic.seizures, 0U);
    EXPECT_EQ(traffic.signalling, 2U);
    EXPECT_EQ(traffic.beforeTrace, 1U);
    EXPECT_EQ(traffic.open, 1U);
}

TEST(Figures, CountByTheHourOfTheSetup) {
    CallScript script;
    call(script, 3599000, 1, 5, 3000);  // begins a second before the hour ends
    call(script, 3700000, 2, 5, 3000);
    refused(script, 7300000, 3, 34);
    const Counted counted(script);
    const auto& hours = counted.figures.hours();
    ASSERT_EQ(hours.size(), 3U);
    EXPECT_EQ(hours.at({capture::Clock::relative, 0}).seizures[0], 1U);
    EXPECT_EQ(hours.at({capture::Clock::relative, 1}).answered[0], 1U);
    EXPECT_EQ(hours.at({capture::Clock::relative, 2}).failed, 1U);
}

TEST(Occupancy, LastsFromTheFirstAnswerToTheEnd) {
    CallScript script;
    call(script, 0, 1, 5, 3000);
    const Counted counted(script, 4000);
    EXPECT_EQ(counted.channel(5).used, 4000 * millisecond);
    EXPECT_EQ(counted.channel(5).calls, 1U);
    EXPECT_FALSE(counted.channel(5).usedAtEnd);
    EXPECT_EQ(counted.group().dChannels, "trunk");
    EXPECT_EQ(counted.group().most, 1U);
}

TEST(Occupancy, CountsChannelsThatAreInUseAtOnce) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech(), channel(1)});
    script.at(12).peer(m::connect, 1, true);
    script.at(2000).us(m::setup, 2, false, {bearerSpeech(), channel(2)});
    script.at(2012).peer(m::connect, 2, true);
    script.at(5000).us(m::releaseComplete, 1, false, {cause(16)});
    script.at(6000).us(m::setup, 3, false, {bearerSpeech(), channel(1)});
    script.at(6012).peer(m::connect, 3, true);
    script.at(8012).peer(m::information, 3, true);
    const Counted counted(script);
    EXPECT_EQ(counted.group().most, 2U);
    EXPECT_EQ(counted.group().mostAt->at, 2012 * millisecond);
    EXPECT_TRUE(counted.channel(1).usedAtEnd);
    EXPECT_EQ(counted.channel(1).used, (4988 + 2000) * millisecond);
    EXPECT_EQ(counted.group().used, (4988 + 2000 + 6000) * millisecond);
    EXPECT_DOUBLE_EQ(counted.group().erlangs(), 12988.0 / 8012.0);
}

TEST(Occupancy, PausesWhileACallIsOnHold) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech(), channel(1)});
    script.at(12).peer(m::connect, 1, true);
    script.at(1012).us(m::hold, 1, false);
    script.at(1012).peer(m::holdAcknowledge, 1, true);
    script.at(5012).us(m::retrieve, 1, false, {channel(1)});
    script.at(5012).peer(m::retrieveAcknowledge, 1, true, {channel(1)});
    script.at(7012).us(m::releaseComplete, 1, false, {cause(16)});
    EXPECT_EQ(Counted(script).channel(1).used, 3 * second);
}

TEST(Occupancy, GoesOnWhenASuspendedCallIsResumed) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech(), channel(1)}).peer(m::connect, 1, true);
    script.at(1000).us(m::suspend, 1, false, {callIdentity(7)}).peer(m::suspendAcknowledge, 1, true);
    script.at(5000).us(m::resume, 2, false, {callIdentity(7)});
    script.peer(m::resumeAcknowledge, 2, true, {channel(1)});
    script.at(7000).us(m::releaseComplete, 2, false, {cause(16)});
    EXPECT_EQ(Counted(script).channel(1).used, 3 * second);
}

TEST(Occupancy, BeginsForACallFromBeforeTheTraceWithTheMessageThatNamesItsChannel) {
    for (const bool onHold : {false, true}) {
        CallScript script;
        script.at(0).peer(m::connect, 1, true, {channel(5)});
        if (onHold)
            script.at(1000).us(m::hold, 1, false).peer(m::holdAcknowledge, 1, true);
        script.at(2000).peer(m::information, 1, true);
        script.at(4000).us(m::releaseComplete, 1, false, {cause(16)});
        const Counted counted(script);
        EXPECT_EQ(counted.channel(5).calls, 1U);
        EXPECT_EQ(counted.channel(5).used, (onHold ? 1 : 4) * second);
    }
}

TEST(Occupancy, BeginsOnlyWhenTheOtherSideTakesTheCall) {
    CallScript script;
    script.at(0).us(m::setup, 1, false, {bearerSpeech(), channel(5)});
    script.at(10).us(m::alerting, 1, false);  // the caller must not send this
    script.at(20).peer(m::status, 1, true, {cause(101), callState(1)});
    script.at(1000).peer(m::releaseComplete, 1, true, {cause(34)});
    EXPECT_EQ(Counted(script).channel(5).calls, 0U);
}

TEST(Occupancy, IsSpreadOverTheHoursThatItTouches) {
    CallScript script;
    script.at(3590000).us(m::setup, 1, false, {bearerSpeech(), channel(1)});
    script.at(3590000).peer(m::connect, 1, true);
    script.at(7210000).us(m::releaseComplete, 1, false, {cause(16)});
    const auto hours = Counted(script).occupancy.hours();
    ASSERT_EQ(hours.size(), 3U);
    EXPECT_EQ(hours.at({capture::Clock::relative, 0}), 10 * second);
    EXPECT_EQ(hours.at({capture::Clock::relative, 1}), 3600 * second);
    EXPECT_EQ(hours.at({capture::Clock::relative, 2}), 10 * second);
}

TEST(Occupancy, StopsAtTheLargestTimeInADamagedCapture) {
    constexpr std::int64_t largest = std::numeric_limits<std::int64_t>::max();
    for (const bool cleared : {false, true}) {
        CallScript script;
        for (std::uint8_t i = 1; i <= 3; ++i) {
            script.at(0).us(m::setup, i, false, {bearerSpeech(), channel(i)});
            script.peer(m::connect, i, true);
        }
        script.at(largest / 3 * 2 / millisecond).us(m::information, 1, false);
        for (std::uint8_t i = 1; cleared && i <= 3; ++i)
            script.us(m::releaseComplete, i, false, {cause(16)});
        const Counted counted(script, 0, Counted::Ticks::dropped);
        EXPECT_GT(counted.channel(3).used, largest / 2);
        EXPECT_EQ(counted.group().used, largest);
        EXPECT_GT(counted.group().erlangs(), 1);
    }
}

TEST(Occupancy, NamesChannelsThatWereNeverUsedOrAreStuck) {
    CallScript script;
    call(script, 0, 1, 30, 1000);
    script.at(4000).us(m::setup, 2, false, {bearerSpeech(), channel(30)});
    script.at(4010).peer(m::releaseComplete, 2, true, {cause(44)});
    script.at(5000).us(m::setup, 3, false, {bearerSpeech(), channel(30)});
    script.at(5010).peer(m::releaseComplete, 3, true, {cause(44)});
    const Counted counted(script);
    EXPECT_TRUE(counted.channel(30).stuck);
    EXPECT_EQ(learntSize(counted.group()), TrunkSize::e1);
    const std::vector<ChannelKey> unused = neverUsed(TrunkSize::e1, counted.group());
    EXPECT_EQ(unused.size(), 29U);
    EXPECT_EQ(unused[14].number, 15U);
    EXPECT_EQ(unused[15].number, 17U);
    EXPECT_EQ(neverUsed(TrunkSize::t1, counted.group()).size(), 23U);
}

}  // namespace calls
