#include "reader/CallLadder.h"

#include <gtest/gtest.h>

#include "reader/LadderText.h"
#include "tests/calls/CallScript.h"

namespace reader {
namespace {

namespace type = isdn::message;
using calls::test::CallScript;

// Ladders of all calls of a script.
class Taken : public calls::Listener {
  public:
    std::vector<CallLadder> of(const CallScript& script, const calls::Options& options = {}) {
        calls::Analysis analysis(options, *this);
        for (const calls::test::Sent& sent : script.frames()) {
            capture::Item item;
            item.frame = sent.frame;
            Seen seen;
            seen.item = &item;
            seen.number = sent.number;
            seen.when = {sent.frame.clock, sent.frame.time};
            seen.at = sent.at;
            readSeen(seen);
            ladders_.see(seen);
            analysis.take(sent.frame, sent.number);
        }
        analysis.finish();
        return taken_;
    }

  private:
    static void readSeen(Seen& seen) { seen.link = isdn::parseLayer2(seen.frame().octets); }
    void heard(const calls::Message& message, const calls::Call* call) override {
        if (call != nullptr)
            ladders_.heard(message, *call);
        else
            ladders_.restarted(message);
    }
    void gone(const calls::Call& call) override { taken_.push_back(ladders_.take(call, times_)); }

    Ladders ladders_;
    TimeText times_;
    std::vector<CallLadder> taken_;
};

std::string namesIn(const CallLadder& ladder) {
    std::string names;
    for (const Rung& rung : ladder.rungs)
        names += (rung.from == calls::Side::us ? "> " : "< ") + rung.name + "\n";
    return names;
}

TEST(CallLadder, NamesBothSidesByOurRole) {
    for (const auto& [role, us, peer] : {std::tuple(capture::Role::user, "us (user)", "peer (network)"),
                                         std::tuple(capture::Role::network, "us (network)", "peer (user)")}) {
        CallScript script(role);
        script.raw(calls::Side::us, true, {0x7F}).raw(calls::Side::peer, false, {0x73});
        script.us(type::setup, 1, false).peer(type::releaseComplete, 1, true);
        const CallLadder ladder = Taken().of(script).at(0);
        EXPECT_EQ(ladder.us, us);
        EXPECT_EQ(ladder.peer, peer);
        EXPECT_EQ(namesIn(ladder), "> SETUP\n< RELEASE COMPLETE\n");
    }
}

TEST(CallLadder, ShowsWhatHappensToTheLinkDuringTheCallAlone) {
    CallScript script;
    script.raw(calls::Side::us, true, {0x7F}).raw(calls::Side::peer, false, {0x73});
    script.at(100).us(type::setup, 1, false).peer(type::connect, 1, true);
    script.at(200).raw(calls::Side::peer, true, {0x53}).raw(calls::Side::us, false, {0x73});
    script.at(300).raw(calls::Side::peer, true, {0x7F}).raw(calls::Side::us, false, {0x73});
    script.at(400).raw(calls::Side::peer, true, {0x00, 0x00, 0x08, 0x02, 0x80, 0x01, 0x5A});
    script.at(500).raw(calls::Side::peer, true, {0x53}).raw(calls::Side::us, false, {0x73});
    EXPECT_EQ(namesIn(Taken().of(script).at(0)),
              "> SETUP\n< CONNECT\n< DISC\n> UA\n< SABME\n> UA\n< RELEASE COMPLETE\n");
}

TEST(CallLadder, ShowsTheRestartThatEndsTheCallAndNoOther) {
    using namespace calls::test;
    CallScript script;
    script.us(type::setup, 1, false, {bearerSpeech(), channel(1)});
    script.at(10).us(type::restart, 0, false, {channel(2), restartIndicator(0)});
    script.at(20).peer(type::restartAcknowledge, 0, true, {channel(2), restartIndicator(0)});
    script.at(30).us(type::restart, 0, false, {channel(1), restartIndicator(0)});
    script.at(40).peer(type::restartAcknowledge, 0, true, {channel(1), restartIndicator(0)});
    EXPECT_EQ(namesIn(Taken().of(script).at(0)), "> SETUP\n< RESTART ACKNOWLEDGE\n");
}

TEST(CallLadder, SaysHowManyMessagesAreNotInIt) {
    CallScript script;
    script.us(type::setup, 1, false);
    for (std::size_t i = 0; i < Ladders::mostOfACall + 9; ++i)
        script.at(static_cast<std::int64_t>(i)).us(type::information, 1, false);
    const CallLadder ladder = Taken().of(script).at(0);
    EXPECT_EQ(ladder.rungs.size(), Ladders::mostOfACall);
    EXPECT_EQ(ladder.missing, 10U);
}

TEST(CallLadder, BeginsEachNewDayWithItsDate) {
    CallScript script;
    script.us(type::setup, 1, false);
    script.at(86'400'000).peer(type::connect, 1, true);
    constexpr std::int64_t start = 989'827'200;
    for (const calls::test::Sent& sent : script.frames()) {
        auto& frame = const_cast<calls::test::Sent&>(sent).frame;
        frame.clock = capture::Clock::absolute;
        frame.time += start * calls::second;
        frame.ticks.reset();
    }
    const CallLadder ladder = Taken().of(script).at(0);
    ASSERT_EQ(ladder.rungs.size(), 3U);
    EXPECT_EQ(ladder.rungs[1].name, "2001-05-15");
    EXPECT_EQ(ladder.rungs[1].kind, Rung::Kind::words);
}

// A call whose messages change their D channel in the middle.
CallScript callOnTwoDChannels() {
    CallScript script;
    script.on("b").linkUp().on("a").linkUp();
    script.at(100).us(type::setup, 1, false);
    script.at(200).on("b").peer(type::connect, 1, true, {calls::test::channel(2)});
    return script;
}

TEST(CallLadder, NamesTheDChannelOfEachArrowOfACallThatHadSeveral) {
    calls::Options options;
    options.groups = {{"a", "b"}};
    const CallLadder ladder = Taken().of(callOnTwoDChannels(), options).at(0);
    ASSERT_EQ(ladder.rungs.size(), 2U);
    EXPECT_TRUE(ladder.namesDChannels);
    EXPECT_EQ(detailsOf(ladder, ladder.rungs[0]), (std::vector<std::string>{"on a"}));
    EXPECT_EQ(detailsOf(ladder, ladder.rungs[1]), (std::vector<std::string>{"on b", "channel 2!"}));
}

TEST(CallLadder, NamesNoDChannelWhereThereIsOne) {
    for (const CallLadder& ladder : Taken().of(callOnTwoDChannels())) {
        EXPECT_FALSE(ladder.namesDChannels);
        EXPECT_EQ(ladder.rungs.size(), 1U);
    }
}

TEST(CallLadder, OfSeveralCallsNamesTheTerminalsAndDChannelsThatDiffer) {
    CallScript script;
    script.on("a").tei(0).us(type::setup, 1, false);
    script.on("b").tei(5).at(10).us(type::setup, 2, false);
    const CallLadder ladder = together(Taken().of(script), {1, 2});
    ASSERT_EQ(ladder.rungs.size(), 2U);
    EXPECT_EQ(detailsOf(ladder, ladder.rungs[0]), (std::vector<std::string>{"on a", "TEI 0", "call 1"}));
    EXPECT_EQ(detailsOf(ladder, ladder.rungs[1]), (std::vector<std::string>{"on b", "TEI 5", "call 2"}));
}

TEST(Wrapped, BreaksLongItemsAtBlanksAndWordsWhereTheyEnd) {
    using Lines = std::vector<std::string>;
    EXPECT_EQ(wrapped({"one", "two", "three"}, 8), (Lines{"one  two", "three"}));
    EXPECT_EQ(wrapped({"one two three", "four"}, 8), (Lines{"one two", "three", "four"}));
    EXPECT_EQ(wrapped({"abcdefghijk", "l"}, 4), (Lines{"abcd", "efgh", "ijk", "l"}));
    EXPECT_EQ(wrapped({"", "a"}, 4), (Lines{"a"}));
}

}  // namespace
}  // namespace reader
