// What the recorder has missed: an answer that may be among it is not called missing.
#include <gtest/gtest.h>

#include <algorithm>
#include <functional>

#include "tests/calls/analysed.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

// A link that is up and has carried a call of ours.
CallScript begun() {
    CallScript script;
    script.at(0).linkUp().at(100).us(m::setup, 1, false, {bearerSpeech()});
    script.at(105).peer(m::releaseComplete, 1, true, {cause(17)});
    script.acknowledge(Side::us);
    return script;
}

// A question and its answer.
struct Question {
    const char* finding;
    std::int64_t timer;  // milliseconds from the question until the finding, without a repetition
    std::function<void(CallScript&)> ask;
    std::function<void(CallScript&)> answer;
};

void talking(CallScript& s) {
    s.us(m::setup, 2, false, {bearerSpeech(), channel(1)});
    s.peer(m::connect, 2, true).us(m::connectAcknowledge, 2, false).acknowledge(Side::peer);
}

const std::vector<Question> questions{
    {"setup-unanswered", 8000, [](CallScript& s) { s.us(m::setup, 2, false, {bearerSpeech()}); },
     [](CallScript& s) { s.peer(m::callProceeding, 2, true); }},
    {"connect-not-acknowledged", 4000,
     [](CallScript& s) {
         s.peer(m::setup, 2, false, {bearerSpeech(), channel(1)});
         s.us(m::connect, 2, true);
     },
     [](CallScript& s) { s.peer(m::connectAcknowledge, 2, false); }},
    {"disconnect-unanswered", 30000,
     [](CallScript& s) {
         talking(s);
         s.us(m::disconnect, 2, false, {cause(16)});
     },
     [](CallScript& s) { s.peer(m::release, 2, true); }},
    {"release-unanswered", 8000,
     [](CallScript& s) {
         talking(s);
         s.us(m::release, 2, false, {cause(16)});
     },
     [](CallScript& s) { s.peer(m::releaseComplete, 2, true); }},
    {"restart-unacknowledged", 240000,
     [](CallScript& s) {
         s.us(m::restart, 0, false, {channel(5), restartIndicator(0)});
     },
     [](CallScript& s) {
         s.peer(m::restartAcknowledge, 0, true, {channel(5), restartIndicator(0)});
     }},
};

// The identifiers of what is found in a trace that lasts until then, a line each, but for what is said of the
// link.
std::string told(const CallScript& script, std::int64_t until, std::uint64_t lossBehind = 0) {
    Collected collected;
    Analysis analysis({}, collected);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames()) {
        analysis.take(sent.frame, ++number);
        if (number == lossBehind)
            analysis.mayMiss(*sent.frame.interface, "Frames Lost");
    }
    analysis.advance(until * millisecond - script.frames().back().at);
    analysis.finish();
    std::string lines;
    for (const Finding& finding : collected.findings) {
        const std::string id(finding.kind->id);
        if (!id.starts_with("ns-gap") && id != "nr-invalid" && id != "frames-lost")
            lines += id + "\n";
    }
    return lines;
}

constexpr std::int64_t asked = 10000;

}  // namespace

TEST(Losses, LeaveAFaultWhereNothingIsMissing) {
    for (const Question& question : questions) {
        CallScript s = begun();
        question.ask(s.at(asked));
        s.at(asked + 50).acknowledge(Side::peer);
        EXPECT_EQ(told(s, asked + question.timer + 100), std::string(question.finding) + "\n");
    }
}

TEST(Losses, OfTheAnswerThatAreSeenInTheNextNumberBeforeTheTimerRunsOut) {
    for (const Question& question : questions) {
        CallScript s = begun();
        question.ask(s.at(asked));
        s.at(asked + 50).acknowledge(Side::peer);
        question.answer(s.at(asked + 60));
        s.unrecorded();
        s.at(asked + 200).peer(m::status, 9, true, {cause(30), callState(0)});  // of another call
        s.at(asked + 210).acknowledge(Side::us);
        EXPECT_EQ(told(s, asked + question.timer + 100), "cannot-be-told\n") << question.finding;
    }
}

TEST(Losses, OfTheAnswerThatAreSeenInTheNextNumberAfterTheTimerRanOut) {
    for (const Question& question : questions) {
        CallScript s = begun();
        question.ask(s.at(asked));
        s.at(asked + 50).acknowledge(Side::peer);
        question.answer(s.at(asked + 60));
        s.unrecorded();
        s.at(asked + question.timer + 500).peer(m::status, 9, true, {cause(30), callState(0)});
        s.at(asked + question.timer + 600).acknowledge(Side::us);
        EXPECT_EQ(told(s, asked + question.timer + 700), "cannot-be-told\n") << question.finding;
    }
}

TEST(Losses, OfTheAnswerThatTheAskersOwnAcknowledgementShows) {
    for (const std::int64_t after : {-100, 200}) {  // before and after the timer runs out
        for (const Question& question : questions) {
            CallScript s = begun();
            question.ask(s.at(asked));
            s.at(asked + 50).acknowledge(Side::peer);
            question.answer(s.at(asked + 60));
            s.unrecorded();
            s.at(asked + question.timer + after).acknowledge(Side::us);
            EXPECT_EQ(told(s, asked + question.timer + 500), "cannot-be-told\n") << question.finding;
        }
    }
}

TEST(Losses, ThatTheRecorderNamesAreADoubtUntilTheNumbersGoOn) {
    for (const Question& question : questions) {
        CallScript s = begun();
        question.ask(s.at(asked));
        s.at(asked + 50).acknowledge(Side::peer);
        const std::uint64_t last = s.frames().size();
        EXPECT_EQ(told(s, asked + question.timer + 100, last), "cannot-be-told\n") << question.finding;
        s.at(asked + 100).poll(Side::us);
        EXPECT_EQ(told(s, asked + question.timer + 100, last), std::string(question.finding) + "\n");
    }
}

TEST(Losses, BetweenTwoCallsMayBeTheClearingOfTheFirst) {
    for (const bool lost : {false, true}) {
        CallScript s = begun();
        talking(s.at(asked));
        if (lost)
            s.at(asked + 5000).us(m::disconnect, 2, false, {cause(16)}).unrecorded();
        if (lost)
            s.peer(m::release, 2, true).unrecorded().us(m::releaseComplete, 2, false).unrecorded();
        s.at(asked + 9000).us(m::setup, 3, false, {bearerSpeech(), channel(1)});
        s.peer(m::callProceeding, 3, true, {channel(1)}).acknowledge(Side::us);
        EXPECT_EQ(told(s, asked + 10000), lost ? "cannot-be-told\n" : "double-seizure\n");
    }
}

TEST(Losses, BetweenTwoCallsMayBeTheEndOfTheFirstWithItsReference) {
    for (const bool lost : {false, true}) {
        CallScript s = begun();
        talking(s.at(asked));
        if (lost)
            s.at(asked + 5000).us(m::release, 2, false, {cause(16)}).unrecorded();
        if (lost)
            s.peer(m::releaseComplete, 2, true).unrecorded();
        s.at(asked + 9000).us(m::setup, 2, false, {bearerSpeech(), channel(7)});
        s.peer(m::releaseComplete, 2, true, {cause(17)}).acknowledge(Side::us);
        EXPECT_EQ(told(s, asked + 10000), lost ? "cannot-be-told\n" : "reference-in-use\nstuck-channel\n");
    }
}

TEST(Losses, InAMessageOfSegmentsAreNoFaultOfItsSender) {
    for (const bool lost : {false, true}) {
        CallScript s = begun();
        s.at(asked).peer(m::segment, 2, false, {Bytes{0x00, 0x02, 0x81, 0x05}, Bytes{0x04, 0x03, 0x80}});
        if (lost)
            s.peer(m::segment, 2, false, {Bytes{0x00, 0x02, 0x00, 0x05}, Bytes{0x90, 0xA3}}).unrecorded();
        s.at(asked + 100).acknowledge(Side::us);
        EXPECT_EQ(told(s, asked + 4100), lost ? "cannot-be-told\n" : "segments-unfinished\n");
        EXPECT_EQ(told(s, asked + 3900), "");
    }
}

TEST(Losses, OfTheAnswerThatShowOnlyAfterALongSilence) {
    constexpr std::int64_t silence = 60000;
    for (const Question& question : questions) {
        CallScript s = begun();
        question.ask(s.at(asked));
        s.at(asked + 50).acknowledge(Side::peer);
        CallScript whole = s;
        question.answer(s.at(asked + 60));
        s.unrecorded();
        const std::int64_t next = asked + question.timer + silence;
        s.at(next).peer(m::status, 9, true, {cause(30), callState(0)});  // of another call
        EXPECT_EQ(told(s, next + silence), "cannot-be-told\n") << question.finding;
        whole.at(next).peer(m::status, 9, true, {cause(30), callState(0)});
        EXPECT_EQ(told(whole, next + silence), std::string(question.finding) + "\n");
    }
}

TEST(Losses, OfTheAnswerThatShowOnlyInTheSecondFrameAfterALongSilence) {
    for (const Question& question : questions) {
        CallScript s = begun();
        question.ask(s.at(asked));
        s.at(asked + 50).acknowledge(Side::peer);
        question.answer(s.at(asked + 60));
        s.unrecorded();
        const std::int64_t next = asked + question.timer + 60000;
        s.at(next).acknowledge(Side::peer);  // tells nothing about what the peer has sent
        CallScript whole = s;
        s.at(next + 5000).peer(m::status, 9, true, {cause(30), callState(0)});  // of another call
        EXPECT_EQ(told(s, next + 30000), "cannot-be-told\n") << question.finding;
        // The link stays up, and nothing that decides comes.
        whole.at(next + 11000).acknowledge(Side::peer).at(next + 12000).acknowledge(Side::peer);
        EXPECT_EQ(told(whole, next + 13000), std::string(question.finding) + "\n");
    }
}

// The recorder misses so many frames of our side that those of the other side may have come round.
TEST(Losses, OfManyFramesOfOneSideLeaveNothingCertainOfTheOther) {
    for (const int count : {7, 8}) {
        CallScript s = begun();
        s.at(asked).us(m::setup, 2, false, {bearerSpeech()});
        s.at(asked + 50).acknowledge(Side::peer);
        for (int frame = 0; frame < count; ++frame)
            s.us(m::status, 9, true, {cause(30), callState(0)}).unrecorded();
        s.at(asked + 4000).us(m::status, 9, true, {cause(30), callState(0)});  // of another call
        s.acknowledge(Side::peer).at(asked + 9000).poll(Side::us);
        EXPECT_EQ(told(s, asked + 20000), count == 7 ? "setup-unanswered\n" : "cannot-be-told\n");
    }
}

// All of the peer's numbers are missing once round, so that its next one fits. That of our side does not.
TEST(Losses, OfOneHundredAndTwentyEightFramesAreSeenInTheNumbersOfTheOtherSide) {
    for (const Question& question : questions) {
        CallScript s = begun();
        question.ask(s.at(asked));
        s.at(asked + 50).acknowledge(Side::peer).acknowledge(Side::us);
        question.answer(s.at(asked + 60));
        s.unrecorded();
        for (int frame = 1; frame < 128; ++frame)
            s.peer(m::status, 9, true, {cause(30), callState(0)}).unrecorded();
        for (int frame = 0; frame < 20; ++frame)
            s.us(m::status, 9, true, {cause(30), callState(0)}).unrecorded();
        const std::int64_t next = asked + question.timer + 60000;
        s.at(next).acknowledge(Side::us);
        s.at(next + 500).us(m::status, 9, true, {cause(30), callState(0)});  // of another call
        EXPECT_EQ(told(s, next + 600), "cannot-be-told\n") << question.finding;
    }
}

namespace {

// What a message shows only together with those before it.
struct Sequel {
    const char* finding;
    std::function<void(CallScript&)> before;  // the recorder may miss its last frame
    std::function<void(CallScript&)> message;
};

const std::vector<Sequel> sequels{
    {"element-absent",
     [](CallScript& s) {
         talking(s);
         s.at(asked + 5000).us(m::disconnect, 2, false, {cause(16)});
     },
     [](CallScript& s) { s.peer(m::release, 2, true); }},
    {"status-unasked",
     [](CallScript& s) {
         talking(s);
         s.at(asked + 5000).us(m::statusEnquiry, 2, false);
     },
     [](CallScript& s) {
         s.peer(m::status, 2, true, {cause(30), callState(10)});
     }},
    {"waits-for-digits",
     [](CallScript& s) {
         s.us(m::setup, 2, false, {bearerSpeech(), called("40")});
         s.peer(m::setupAcknowledge, 2, true, {channel(1)}).acknowledge(Side::us);
         s.at(asked + 11000).us(m::information, 2, false, {called("1")});
     },
     [](CallScript& s) { s.peer(m::alerting, 2, true); }},
};

}  // namespace

TEST(Losses, BeforeAMessageMayExplainIt) {
    for (const Sequel& each : sequels) {
        for (const bool alone : {false, true}) {  // whether RR or the message acknowledges what is missing
            CallScript s = begun();
            each.before(s.at(asked));
            s.unrecorded();
            if (alone)
                s.at(asked + 11500).acknowledge(Side::peer);
            each.message(s.at(asked + 11600));
            s.at(asked + 11700).us(m::status, 9, true, {cause(30), callState(0)});  // of another call
            EXPECT_EQ(told(s, asked + 11800), "") << each.finding;
        }
    }
}

TEST(Losses, AreNotNeededForThatInAWholeTrace) {
    for (const Sequel& each : sequels) {
        CallScript s = begun();
        each.before(s.at(asked));
        each.message(s.at(asked + 11600));
        EXPECT_EQ(told(s, asked + 11700), "") << each.finding;
    }
}

// Our frame, which the message acknowledges, is recorded behind it. Nothing is missing.
TEST(Losses, AreNotSuspectedForFramesInTheWrongOrder) {
    for (const std::int64_t late : {4, 8, 12}) {
        CallScript s = begun();
        talking(s.at(asked));
        s.us(m::status, 9, true, {cause(30), callState(0)}).unrecorded();
        const std::size_t missed = s.frames().size();
        s.at(asked + 5000).peer(m::release, 2, true);
        ASSERT_EQ(s.frames().size(), missed + 1);
        s.at(asked + 5000 + late);
        s.raw(Side::us, true, {0x06, 0x04, 0x08, 0x02, 0x80, 0x09, 0x7B});  // N(S) = 3, N(R) = 2
        EXPECT_EQ(told(s, asked + 6000), "element-absent\n") << late;
    }
}

TEST(Losses, OfOurOwnAnswerThatShowOnlyInTheNextNumber) {
    for (const bool lost : {true, false}) {
        CallScript s = begun();
        s.at(asked).peer(m::setup, 2, false, {bearerSpeech(), channel(5)});
        s.at(asked + 50).acknowledge(Side::us);
        if (lost)
            s.at(asked + 60).us(m::callProceeding, 2, true, {channel(5)}).unrecorded();
        s.at(asked + 30000).us(m::status, 9, true, {cause(30), callState(0)});
        EXPECT_EQ(told(s, asked + 90000), lost ? "cannot-be-told\n" : "setup-unanswered\n");
    }
}

TEST(Losses, OfTheAnswerAmongMoreFramesThanTheLineCanLose) {
    for (const Question& question : questions) {
        CallScript s = begun();
        question.ask(s.at(asked));
        s.at(asked + 50).acknowledge(Side::peer);
        question.answer(s.at(asked + 60));
        s.unrecorded();
        for (int frame = 0; frame < 100; ++frame)
            s.peer(m::status, 9, true, {cause(30), callState(0)}).unrecorded();
        const std::int64_t next = asked + question.timer + 500;
        s.at(next).peer(m::status, 9, true, {cause(30), callState(0)});
        EXPECT_EQ(told(s, next + 60000), "cannot-be-told\n") << question.finding;
    }
}

TEST(Losses, OfTheAnswerThatShowBehindATimerWhileAnEarlierFrameIsNotAcknowledgedYet) {
    CallScript s = begun();
    s.at(asked).us(m::setup, 2, false, {bearerSpeech()});
    s.at(asked + 50).acknowledge(Side::peer);
    s.at(asked + 200).peer(m::status, 9, true, {cause(30), callState(0)});
    s.peer(m::callProceeding, 2, true).unrecorded();
    s.at(asked + 8100).raw(Side::us, false, {0x01, 0x02});  // RR, N(R) = 1: acknowledges neither
    s.at(asked + 8200).peer(m::status, 9, true, {cause(30), callState(0)});
    EXPECT_EQ(told(s, asked + 30000), "cannot-be-told\n");
}

TEST(Losses, LeaveOneNoteForQuestionsThatBelongToNoCall) {
    CallScript s = begun();
    for (const std::uint8_t number : {5, 6})
        s.at(asked).us(m::restart, 0, false, {channel(number), restartIndicator(0)});
    s.acknowledge(Side::peer);
    s.at(asked + 500).raw(Side::peer, true, {0x7F}).raw(Side::us, false, {0x73});  // SABME, UA
    Collected collected;
    analyse(s, collected, 300000);
    const auto note = std::find_if(collected.findings.begin(), collected.findings.end(),
                                   [](const Finding& each) { return each.kind->id == "cannot-be-told"; });
    ASSERT_NE(note, collected.findings.end()) << collected.lines;
    EXPECT_EQ(note->sentence, "2 questions got no answer, but the link was down meanwhile");
}

TEST(Losses, OfALinkLeaveOneNoteForAllQuestionsThatWereOpen) {
    CallScript s = begun();
    for (std::uint16_t i = 0; i < 3; ++i)
        s.at(asked + i * 100).us(m::setup, i + 2, false, {bearerSpeech()}).acknowledge(Side::peer);
    s.at(asked + 500).raw(Side::peer, true, {0x7F}).raw(Side::us, false, {0x73});  // SABME, UA
    Collected collected;
    Analysis analysis({}, collected);
    std::uint64_t number = 0;
    for (const Sent& sent : s.frames())
        analysis.take(sent.frame, ++number);
    analysis.advance(20 * second);
    std::vector<Finding> notes;
    for (const Finding& finding : collected.findings)
        if (finding.kind->id == "cannot-be-told")
            notes.push_back(finding);
    ASSERT_EQ(notes.size(), 1U) << collected.lines;
    EXPECT_EQ(notes[0].count, 3U);
    EXPECT_EQ(notes[0].sentence,
              "3 questions got no answer, of calls 2, 3, 4, but the link was down meanwhile");
}

}  // namespace calls
