#include "reader/CallGate.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/calls/CallScript.h"

namespace reader {
namespace {

namespace type = isdn::message;
using calls::test::CallScript;

// Two calls that interleave: the first is refused with cause 34, and has failed; the second one is answered,
// and cleared after it. Then a poll.
CallScript twoCalls() {
    CallScript script;
    using namespace calls::test;
    script.us(type::setup, 1, false, {bearerSpeech(), channel(1)});
    script.at(10).us(type::setup, 2, false, {bearerSpeech(), channel(2)});
    script.at(20).peer(type::connect, 2, true, {channel(2)});
    script.at(30).peer(type::releaseComplete, 1, true, {cause(34, 2)});
    script.at(40).peer(type::disconnect, 2, true, {cause(16)});
    script.at(50).us(type::release, 2, false);
    script.at(60).peer(type::releaseComplete, 2, true);
    script.raw(calls::Side::us, true, {0x01, 0x01});
    return script;
}

// The numbers of the frames that are let through, with a stroke after each frame that was taken.
class Passed {
  public:
    Passed(const std::vector<FilterWord>& words, CallGate::Order order, std::size_t most = CallGate::mostHeld)
        : filter_(words), gate_(filter_, {}, order, most) {}

    std::string of(const CallScript& script) {
        for (const calls::test::Sent& sent : script.frames()) {
            capture::Item item;
            item.frame = sent.frame;
            Seen seen;
            seen.item = &item;
            seen.number = sent.number;
            gate_.take(seen);
            put();
            passed_ += '|';
        }
        gate_.finish();
        put();
        return passed_;
    }
    std::uint64_t letGo() const { return gate_.letGo(); }

  private:
    void put() {
        while (const Seen* const seen = gate_.next())
            passed_ += std::to_string(seen->number);
    }

    CallFilter filter_;
    CallGate gate_;
    std::string passed_;
};

using enum CallGate::Order;

TEST(CallGate, LetsFramesOfACallThroughAtOnceWhereItsNumberTells) {
    EXPECT_EQ(Passed({{"call", "2"}}, ofInput).of(twoCalls()), "|2|3||5|6|7||");
    EXPECT_EQ(Passed({{"call", "1,7"}}, ofDecision).of(twoCalls()), "1|||4|||||");
}

TEST(CallGate, HoldsFramesUntilTheEndOfTheirCallTells) {
    EXPECT_EQ(Passed({{"failed", ""}}, ofInput).of(twoCalls()), "||||||||14");
    EXPECT_EQ(Passed({{"failed", "", true}, {"call", "2"}}, ofInput).of(twoCalls()), "||||||||23567");
}

TEST(CallGate, LetsHeldItemsThroughInTheOrderOfTheInput) {
    CallScript script = twoCalls();
    using namespace calls::test;
    script.at(70).us(type::setup, 3, false, {bearerSpeech(), channel(3)});
    script.at(80).peer(type::releaseComplete, 3, true, {cause(38, 2)});
    script.at(10'000).us(type::setup, 4, false, {bearerSpeech(), channel(4)});
    EXPECT_EQ(Passed({{"failed", ""}}, ofInput).of(script), "||||||||||14910|");
    EXPECT_EQ(Passed({{"failed", "", true}}, ofInput).of(script), "||||||||||235678|11");
}

TEST(CallGate, GivesOnACallAtItsEndWhereDecisionsAreTheOrder) {
    CallScript script = twoCalls();
    using namespace calls::test;
    script.at(5'000).us(type::status, 0, false);
    script.at(9'000).us(type::status, 0, false);
    EXPECT_EQ(Passed({{"failed", ""}}, ofDecision).of(script), "||||||||14||");
    EXPECT_EQ(Passed({{"failed", "", true}}, ofDecision).of(script), "|||||||8|235679|10|");
}

TEST(CallGate, LetsItemsOfNoCallThroughIfOnlyCallsAreRefused) {
    EXPECT_EQ(Passed({{"call", "2", true}}, ofInput).of(twoCalls()), "1|||4||||8|");
}

TEST(CallGate, LetsTheOldestFramesGoWhenTooManyAreHeld) {
    Passed passed({{"failed", "", true}}, ofInput, 3);
    // Frame 8, which belongs to no call, is held up by the others.
    EXPECT_EQ(passed.of(twoCalls()), "||||||||678");
    EXPECT_EQ(passed.letGo(), 5U);
}

TEST(CallGate, RefusesANumberThatNoCallHas) {
    EXPECT_THROW(CallFilter({{{"call", "0"}}}), UsageError);
    EXPECT_THROW(CallFilter({{{"call", "0378o"}}}), UsageError);
    EXPECT_THROW(CallFilter({{{"call", ","}}}), UsageError);
}

}  // namespace
}  // namespace reader
