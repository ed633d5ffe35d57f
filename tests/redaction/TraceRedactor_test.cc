// A trace as a program hands it over that redacts while frames come.
#include "redaction/TraceRedactor.h"

#include <gtest/gtest.h>

#include "tests/redaction/redacted.h"

namespace redaction {
namespace {

using calls::test::bearerSpeech;
using calls::test::called;
using calls::test::CallScript;
using test::Bytes;
using test::Passed;
namespace type = isdn::message;

class Trace : public ::testing::Test {
  protected:
    // Seconds on the frames' clock.
    std::vector<std::uint64_t> take(const Passed& passed, std::int64_t seconds,
                                    const capture::Interface& trunk) {
        capture::Frame frame;
        frame.octets = passed.octets;
        frame.transmitted = passed.transmitted;
        frame.role = capture::Role::user;
        frame.clock = capture::Clock::relative;
        frame.time = seconds * calls::second;
        frame.interface = &trunk;
        std::vector<Rebuilt> done;
        redactor_.take(frame, ++number_, isdn::Variant::net5, done);
        return keep(done);
    }
    std::vector<std::uint64_t> keep(std::vector<Rebuilt>& done) {
        std::vector<std::uint64_t> numbers;
        for (Rebuilt& each : done) {
            numbers.push_back(each.number);
            octets_[each.number] = std::move(each.octets);
        }
        return numbers;
    }
    static std::vector<Passed> beginningOfSegments() {
        CallScript script;
        script.us(type::segment, 1, false, {{0x00, 0x02, 0x81, type::setup, 0x28, 0x04, 'J', 'o', 'h', 'n'}})
            .peer(type::statusEnquiry, 7, true);
        return test::passedIn(script);
    }

    const capture::Interface trunk_{"trunk"}, other_{"other"};
    TraceRedactor redactor_{test::keyOf(1), Direction::redact};
    std::map<std::uint64_t, Bytes> octets_;
    std::uint64_t number_ = 0;
};

using Numbers = std::vector<std::uint64_t>;

TEST_F(Trace, givesAFrameThatCanBeRedactedAtOnce) {
    CallScript script;
    script.us(type::setup, 1, false, {bearerSpeech(), called("03012345")});
    const std::vector<Passed> frames = test::passedIn(script);
    EXPECT_EQ(take(frames[0], 0, trunk_), Numbers{1});
    EXPECT_EQ(octets_[1].size(), frames[0].octets.size());
    EXPECT_FALSE(test::holds(octets_[1], "03012345"));
}

TEST_F(Trace, keepsTheNumbersOfTwoTrunksApart) {
    CallScript script;
    script.us(type::setup, 1, false, {called("030")}).us(type::information, 1, false, {called("1")});
    const std::vector<Passed> frames = test::passedIn(script);
    take(frames[0], 0, trunk_);
    take(frames[0], 1, other_);
    take(frames[1], 2, trunk_);
    take(frames[1], 3, other_);
    EXPECT_EQ(octets_[1], octets_[2]);
    EXPECT_EQ(octets_[3], octets_[4]);
    CallScript whole;
    whole.us(type::setup, 1, false, {called("0301")});
    const capture::Interface third{"third"};
    take(test::passedIn(whole)[0], 4, third);
    EXPECT_EQ(octets_[3].back(), octets_[5].back());  // the number goes on
}

TEST_F(Trace, blanksDigitsBehindALoss) {
    CallScript script;
    script.us(type::setup, 1, false, {called("030")}).us(type::information, 1, false, {called("1")});
    const std::vector<Passed> frames = test::passedIn(script);
    take(frames[0], 0, trunk_);
    redactor_.mayMiss(trunk_, "Frames Lost");
    take(frames[1], 1, trunk_);
    EXPECT_EQ(octets_[2].back(), '0');
}

TEST_F(Trace, holdsASegmentBackAndNothingElse) {
    const std::vector<Passed> frames = beginningOfSegments();
    EXPECT_EQ(take(frames[0], 0, trunk_), Numbers{});
    EXPECT_TRUE(redactor_.isWaiting());
    EXPECT_EQ(take(frames[1], 1, trunk_), Numbers{2});
    std::vector<Rebuilt> done;
    redactor_.giveUp(done);
    EXPECT_EQ(keep(done), Numbers{1});
    EXPECT_FALSE(redactor_.isWaiting());
    EXPECT_FALSE(test::holds(octets_[1], "John"));
}

TEST_F(Trace, givesUpASegmentThatHasWaitedLongEnough) {
    const std::vector<Passed> frames = beginningOfSegments();
    take(frames[0], 0, trunk_);
    EXPECT_EQ(take(frames[1], 11, trunk_), (Numbers{2, 1}));
    EXPECT_FALSE(test::holds(octets_[1], "John"));
}

TEST_F(Trace, givesUpASegmentBehindWhichManyFramesHaveCome) {
    const std::vector<Passed> frames = beginningOfSegments();
    take(frames[0], 0, trunk_);
    std::uint64_t came = 0;
    while (redactor_.isWaiting() && came < 2 * TraceRedactor::mostWaiting)
        came += take(frames[1], 0, trunk_).size();
    EXPECT_EQ(came, TraceRedactor::mostWaiting + 2);  // the segment with the last of them
}

}  // namespace
}  // namespace redaction
