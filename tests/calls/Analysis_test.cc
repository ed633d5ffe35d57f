#include "calls/Analysis.h"

#include <gtest/gtest.h>

#include "tests/calls/CallScript.h"
#include "tests/calls/Script.h"
#include "tests/calls/recorded.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

// Writes what a listener is told, one line for each.
class Told : public Listener {
  public:
    void heard(const Message& message, const Call* call) override {
        heardLines += std::to_string(message.number) + " " + std::string(isdn::messageName(message.layer3)) +
                      " " + (call == nullptr ? "-" : std::to_string(call->number)) + "\n";
    }
    void gone(const Call& call) override {
        goneLines += std::to_string(call.number) + " " + std::string(nameOf(call.outcome)) + " " +
                     std::string(nameOf(call.endedBy)) + "\n";
        calls.push_back(call);
    }
    void found(const Finding& finding) override {
        foundLines += std::to_string(finding.frame) + " " + std::string(finding.kind->id) + "\n";
    }

    std::string heardLines, goneLines, foundLines;
    std::vector<Call> calls;
};

class AnalysisTest : public ::testing::Test {
  protected:
    void play(Analysis& analysis, const CallScript& script) {
        for (const Sent& sent : script.frames())
            analysis.take(sent.frame, ++number);
    }
    Told told;
    std::uint64_t number = 0;
};

CallScript shortCall() {
    CallScript script;
    script.at(0).us(m::setup, 9, false, {bearerSpeech(), channel(30), called("100")});
    script.at(20).peer(m::callProceeding, 9, true, {channel(30)});
    script.at(40).peer(m::releaseComplete, 9, true, {cause(17)});
    return script;
}

}  // namespace

TEST_F(AnalysisTest, HandsAMessageThatLayer2RepeatedToNoCallTwice) {
    CallScript script = shortCall();
    Analysis analysis({}, told);
    analysis.take(script.frames()[0].frame, 1);
    analysis.take(script.frames()[0].frame, 2);  // sent again
    analysis.take(script.frames()[1].frame, 3);
    analysis.take(script.frames()[2].frame, 4);
    analysis.finish();
    EXPECT_EQ(told.heardLines, "1 SETUP 1\n3 CALL PROCEEDING 1\n4 RELEASE COMPLETE 1\n");
    EXPECT_EQ(told.goneLines, "1 busy release\n");
    EXPECT_EQ(told.foundLines, "");
}

TEST_F(AnalysisTest, PutsSegmentsTogetherBeforeAnythingLooksAtThem) {
    CallScript script;
    // A SETUP whose elements are cut in the middle of CALLED PARTY NUM: 04 03 80 90 A3 | 70 03 81 | 31 32.
    script.at(0).us(m::segment, 9, false,
                    {Bytes{0x00, 0x02, 0x81, 0x05}, Bytes{0x04, 0x03, 0x80, 0x90, 0xA3, 0x70, 0x03, 0x81}});
    script.at(10).us(m::segment, 9, false, {Bytes{0x00, 0x02, 0x00, 0x05}, Bytes{0x31, 0x32}});
    script.at(20).peer(m::releaseComplete, 9, true, {cause(17)});
    Analysis analysis({}, told);
    play(analysis, script);
    analysis.finish();
    EXPECT_EQ(told.heardLines, "2 SETUP 1\n3 RELEASE COMPLETE 1\n");
    EXPECT_EQ(told.calls.at(0).called.digits, "12");
    EXPECT_EQ(told.foundLines, "");
}

TEST_F(AnalysisTest, FindsSegmentsWhoseNextOneDoesNotCome) {
    CallScript script;
    script.at(0).us(m::segment, 9, false, {Bytes{0x00, 0x02, 0x81, 0x05}, Bytes{0x04, 0x03, 0x80}});
    script.at(5000).peer(m::information, 8, true);
    script.at(5010).us(m::segment, 7, false, {Bytes{0x00, 0x02, 0x01, 0x05}, Bytes{0x31, 0x32}});
    script.at(9990).us(m::information, 8, false);
    Analysis analysis({}, told);
    play(analysis, script);
    analysis.finish();
    EXPECT_EQ(told.foundLines, "1 segments-unfinished\n3 segments-unfinished\n");
}

TEST_F(AnalysisTest, FindsSegmentsThatAnotherMessageReplaces) {
    CallScript script;
    const Bytes first{0x00, 0x02, 0x81, 0x05}, last{0x00, 0x02, 0x00, 0x05};
    script.at(0).us(m::segment, 9, false, {first, Bytes{0x04, 0x03, 0x80}});
    script.at(100).us(m::segment, 9, false, {first, Bytes{0x04, 0x03, 0x80, 0x90, 0xA3, 0x70, 0x03, 0x81}});
    script.at(200).us(m::segment, 9, false, {last, Bytes{0x31, 0x32}});
    script.at(300).peer(m::releaseComplete, 9, true, {cause(17)});
    Analysis analysis({}, told);
    play(analysis, script);
    analysis.finish();
    EXPECT_EQ(told.heardLines, "3 SETUP 1\n4 RELEASE COMPLETE 1\n");
    EXPECT_EQ(told.foundLines, "1 segments-unfinished\n");
}

TEST_F(AnalysisTest, KeepsDChannelsApartUnlessTheyShareTheirCalls) {
    const capture::Interface first{"A", capture::Variant::ni2};
    const capture::Interface standby{"B", capture::Variant::ni2};
    for (const bool shared : {false, true}) {
        Told own;
        Options options;
        if (shared)
            options.groups = {{"A", "B"}};
        Analysis analysis(options, own);
        const CallScript script = shortCall();
        std::uint64_t n = 0;
        for (const Sent& sent : script.frames()) {
            capture::Frame frame = sent.frame;
            frame.interface = n < 2 ? &first : &standby;  // a changeover before the last message
            analysis.take(frame, ++n);
        }
        analysis.finish();
        EXPECT_EQ(own.goneLines, shared ? "1 busy release\n" : "1 open open\n2 busy release\n");
    }
}

// The N(R) of a new set-up counts other frames than the one that began the clearing.
TEST_F(AnalysisTest, FindsNoCrossingOfClearingsBetweenWhichTheLinkWasSetUpAgain) {
    for (const bool seen : {true, false}) {
        Told own;
        CallScript script;
        script.at(0).linkUp().us(m::setup, 9, false, {bearerSpeech(), channel(1), called("100")});
        script.at(20).peer(m::callProceeding, 9, true, {channel(1)}).peer(m::connect, 9, true);
        script.at(30).us(m::connectAcknowledge, 9, false);
        script.at(5000).us(m::disconnect, 9, false, {cause(16)}).acknowledge(Side::peer);
        script.at(5100).linkUp();
        if (!seen)
            script.unrecorded().unrecorded();
        script.at(5200).peer(m::release, 9, true);
        script.at(5210).us(m::releaseComplete, 9, false);
        Analysis analysis({}, own);
        play(analysis, script);
        analysis.finish();
        ASSERT_EQ(own.calls.size(), 1U);
        EXPECT_EQ(own.calls[0].clearedBy, ClearedBy::us) << (seen ? "SABME was recorded" : "and not");
    }
}

TEST_F(AnalysisTest, TakesAMessageAsTheVariantOfItsDChannelSays) {
    class Variants : public Listener {
      public:
        void heard(const Message& message, const Call*) override { seen.push_back(message.variant); }
        std::vector<isdn::Variant> seen;
    };
    const capture::Interface american{"A", capture::Variant::ni2}, european{"B", capture::Variant::net5};
    Variants variants;
    Analysis analysis({}, variants);
    const CallScript script = shortCall();
    for (const capture::Interface* const interface : {&american, &european}) {
        capture::Frame frame = script.frames()[0].frame;
        frame.interface = interface;
        analysis.take(frame, ++number);
    }
    EXPECT_EQ(variants.seen, (std::vector{isdn::Variant::ni2, isdn::Variant::net5}));
}

// The frame that the recorder has seen without its octets may have been the DISCONNECT, with its cause.
TEST_F(AnalysisTest, MissesNoCauseOfACallThatMayLackAMessage) {
    for (const bool lacks : {false, true}) {
        Told own;
        CallScript script;
        script.at(0).us(m::setup, 9, false, {bearerSpeech(), channel(30), called("100")});
        script.at(20).peer(m::callProceeding, 9, true, {channel(30)});
        script.at(5000).peer(m::release, 9, true);
        Analysis analysis({}, own);
        std::uint64_t n = 0;
        for (const Sent& sent : script.frames()) {
            if (n == 2 && lacks)
                analysis.mayLack(*sent.frame.interface, Side::us);
            analysis.take(sent.frame, ++n);
        }
        analysis.finish();
        EXPECT_EQ(own.foundLines, lacks ? "" : "3 element-absent\n");
    }
}

TEST_F(AnalysisTest, MakesOpenCallsUncertainWhenTheTicksFall) {
    CallScript script;
    script.at(100000).us(m::setup, 9, false, {bearerSpeech()});
    script.at(100100).peer(m::callProceeding, 9, true);
    script.at(200).us(m::information, 9, false);
    Analysis analysis({}, told);
    play(analysis, script);
    analysis.finish();
    ASSERT_EQ(told.calls.size(), 1U);
    EXPECT_TRUE(told.calls[0].uncertain);
}

TEST_F(AnalysisTest, FollowsTheRecordedCallsAndFindsNothingWrongInThem) {
    struct {
        std::string_view excerpt;
        const char* gone;
    } const cases[] = {{testing::europeanPrimary, "1 answered open\n"},
                       {testing::northAmericanCall, "1 answered release\n"},
                       {testing::nationalBasic, "1 answered open\n"}};
    const capture::Interface trunk{"trunk", capture::Variant::unknown};
    for (const auto& each : cases) {
        Told own;
        Analysis analysis({}, own);
        std::uint64_t n = 0;
        for (const testing::ScriptFrame& scripted : testing::recordedFrames(each.excerpt)) {
            capture::Frame frame = testing::frameOf(scripted);
            frame.interface = &trunk;
            analysis.take(frame, ++n);
        }
        analysis.finish();
        EXPECT_EQ(own.goneLines, each.gone);
        EXPECT_EQ(own.foundLines, "");
    }
}

TEST_F(AnalysisTest, ReportsFindingsAboutLinks) {
    const capture::Interface standby{"standby"}, trunk{"trunk"};
    const std::vector<testing::ScriptFrame> refused = testing::script("0 > SABME\n0.01 < DM F\n");
    Options options;
    options.groups = {{"standby", "primary"}};
    Analysis analysis(options, told);
    analysis.mayMiss(trunk, "Frames Lost");
    for (const capture::Interface* const interface : {&standby, &trunk}) {
        for (const testing::ScriptFrame& scripted : refused) {
            capture::Frame frame = testing::frameOf(scripted);
            frame.interface = interface;
            analysis.take(frame, ++number);
        }
    }
    analysis.restarted(trunk);
    analysis.finish();
    EXPECT_EQ(told.foundLines, "0 frames-lost\n4 link-refused\n4 board-restarted\n");
}

}  // namespace calls
