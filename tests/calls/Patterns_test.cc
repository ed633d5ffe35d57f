#include "calls/Patterns.h"

#include <gtest/gtest.h>

#include "tests/calls/analysed.h"

namespace calls {

namespace {

using namespace test;
namespace m = isdn::message;

void call(CallScript& script, std::int64_t begin, std::uint16_t ref, std::int64_t length) {
    script.at(begin).us(m::setup, ref, false, {bearerSpeech()});
    script.at(begin + 10).peer(m::connect, ref, true);
    script.at(begin + 10 + length).us(m::disconnect, ref, false, {cause(16)});
    script.at(begin + 20 + length).peer(m::release, ref, true);
    script.at(begin + 30 + length).us(m::releaseComplete, ref, false);
}

void failedCall(CallScript& script, std::int64_t begin, std::uint16_t ref, const std::string& number,
                std::uint8_t value) {
    script.at(begin).us(m::setup, ref, false, {called(number)});
    script.at(begin + 10).peer(m::releaseComplete, ref, true, {cause(value, 2)});
}

std::string patternsIn(const CallScript& script) {
    Collected collected;
    analyse(script, collected);
    std::string lines;
    for (const Finding& finding : collected.findings) {
        if (finding.kind->id != "element-absent")
            lines += std::string(finding.kind->id) + "\n";
    }
    return lines;
}

}  // namespace

TEST(Patterns, NoteCallsThatAllEndAfterTheSameTime) {
    CallScript script;
    for (std::uint16_t i = 0; i < 4; ++i)
        call(script, i * 2000000, i + 1, 1800000 + i * 100);
    EXPECT_EQ(patternsIn(script), "");
    call(script, 9000000, 5, 1800200);
    EXPECT_EQ(patternsIn(script), "same-duration\n");
}

TEST(Patterns, NoteOneLengthOnceHoweverManyCallsHaveIt) {
    CallScript script;
    for (std::uint16_t i = 0; i < 9; ++i)
        call(script, i * 200000, i + 1, 60000);
    EXPECT_EQ(patternsIn(script), "same-duration\n");
}

TEST(Patterns, AreSilentOnCallsOfVariousLengths) {
    CallScript script;
    std::int64_t begin = 0;
    for (std::uint16_t i = 0; i < 100; ++i) {
        const std::int64_t length = 11000 + std::int64_t{i} * 7919 % 400 * 1000;
        call(script, begin, i + 1, length);
        begin += length + 1000;
    }
    EXPECT_EQ(patternsIn(script), "");
}

TEST(Patterns, FindOneCauseInManyCallsWithSomethingInCommon) {
    CallScript script;
    for (std::uint16_t i = 0; i < 5; ++i)
        failedCall(script, i * 5000, i + 1, "003312" + std::to_string(i), 34);
    EXPECT_EQ(patternsIn(script), "cause-burst\n");
}

TEST(Patterns, AreSilentWhenNothingIsCommonOrTheCauseIsOrdinary) {
    CallScript script;
    for (std::uint16_t i = 0; i < 5; ++i) {
        failedCall(script, i * 5000, i + 1, std::to_string(i) + "12345", 34);
        failedCall(script, i * 5000 + 2000, i + 101, "003312", 17);
    }
    EXPECT_EQ(patternsIn(script), "");
}

TEST(Patterns, FindCallsThatEndTogetherWithTheLink) {
    CallScript script;
    for (std::uint16_t i = 1; i <= 3; ++i) {
        script.at(i * 100).us(m::setup, i, false, {bearerSpeech()});
        script.at(i * 100 + 10).peer(m::connect, i, true);
    }
    script.at(5000).raw(Side::peer, true, {0x53});     // DISC, P = 1
    script.at(5010).raw(Side::us, false, {0x73});      // UA, F = 1
    script.at(200000).raw(Side::us, true, {0x7F});     // SABME, P = 1
    script.at(200010).raw(Side::peer, false, {0x73});  // UA, F = 1
    script.at(300000).us(m::setup, 9, false, {bearerSpeech()});
    EXPECT_NE(patternsIn(script).find("mass-clear\n"), std::string::npos) << patternsIn(script);
}

TEST(Patterns, BlameNoLinkForCallsThatEndLaterThanASecondOrBeforeAnyEventOfIt) {
    const auto threeCallsEnd = [](CallScript& script, std::int64_t begin, std::int64_t end) {
        for (std::uint16_t i = 1; i <= 3; ++i)
            script.at(begin).us(m::setup, i, false, {bearerSpeech()});
        for (std::uint16_t i = 1; i <= 3; ++i)
            script.at(end).peer(m::releaseComplete, i, true, {cause(41)});
    };
    CallScript without;
    threeCallsEnd(without, 100, 200);
    EXPECT_EQ(patternsIn(without), "");
    for (const auto& [end, findings] :
         {std::pair(10000, "link-flap\nmass-clear\n"), {10004, "link-flap\n"}}) {
        CallScript script;
        script.at(0).linkUp().at(9000).linkUp();
        threeCallsEnd(script, 9100, end);
        EXPECT_EQ(patternsIn(script), findings) << end;
    }
}

TEST(Patterns, ReferToTheFaultOfTheLinkThatCallsEndedWith) {
    for (const bool flaps : {false, true}) {
        CallScript script;
        script.at(0).linkUp();
        for (std::uint16_t i = 1; i <= 3; ++i) {
            script.at(i * 100).us(m::setup, i, false,
                                  {bearerSpeech(), channel(static_cast<std::uint8_t>(i))});
            script.at(i * 100 + 10).peer(m::connect, i, true);
        }
        if (!flaps)
            script.at(8900).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
        script.at(9000).linkUp();
        for (std::uint16_t i = 1; i <= 3; ++i)
            script.at(9100).peer(m::releaseComplete, i, true, {cause(41)});
        Collected collected;
        analyse(script, collected, 400000);
        const std::string says = "3 calls ended with the link, which was set up here: 1, 2, 3";
        if (flaps) {
            EXPECT_EQ(collected.lines, "9 link-flap\n10 mass-clear\n");
            EXPECT_EQ(collected.findings.back().sentence, says + "; they follow from link-flap of frame 9");
            EXPECT_EQ(collected.findings.back().severity, Severity::note);
        } else {
            EXPECT_EQ(collected.lines, "12 mass-clear\n");
            EXPECT_EQ(collected.findings.back().sentence, says);
            EXPECT_EQ(collected.findings.back().severity, Severity::error);
        }
    }
}

namespace {

// The only finding about calls that ended with their link.
Finding massClearIn(const CallScript& script, const Options& options = {}) {
    Collected collected;
    Analysis analysis(options, collected);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames())
        analysis.take(sent.frame, ++number);
    analysis.advance(400 * second);
    analysis.finish();
    Finding massClear;
    for (const Finding& finding : collected.findings) {
        if (finding.kind->id == "mass-clear") {
            EXPECT_EQ(massClear.kind, nullptr) << collected.lines;
            massClear = finding;
        }
    }
    EXPECT_NE(massClear.kind, nullptr) << collected.lines;
    return massClear;
}

void threeCallsBegin(CallScript& script) {
    for (std::uint8_t i = 1; i <= 3; ++i)
        script.us(m::setup, i, false, {bearerSpeech(), channel(i)}).peer(m::connect, i, true);
}

void threeCallsEnd(CallScript& script) {
    for (std::uint8_t i = 1; i <= 3; ++i)
        script.peer(m::releaseComplete, i, true, {cause(41)});
}

void releaseLink(CallScript& script) {
    script.raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
}

}  // namespace

TEST(Patterns, ReferToNoFaultThatIsMoreThanAMinuteOlderThanTheEventOfTheLink) {
    for (const std::int64_t age : {60000, 60004}) {
        CallScript script;
        script.at(0).linkUp().at(9000).linkUp();  // a flap
        threeCallsBegin(script);
        releaseLink(script.at(9000 + age));
        threeCallsEnd(script.linkUp());
        const Finding finding = massClearIn(script);
        EXPECT_EQ(finding.severity, age == 60000 ? Severity::note : Severity::error) << age;
        EXPECT_EQ(finding.sentence.find("link-flap") != std::string::npos, age == 60000) << finding.sentence;
    }
}

TEST(Patterns, ReferToNoFaultOfAnotherDChannel) {
    for (const std::string calls : {"A", "B"}) {
        CallScript script;
        script.at(0).on("B").linkUp().us(m::setup, 9, false, {bearerSpeech()});
        script.peer(m::releaseComplete, 9, true, {cause(17)});
        script.on(calls).linkUp();
        threeCallsBegin(script);
        script.at(5000).on("B").linkUp();  // a flap of B
        releaseLink(script.at(5010).on(calls));
        threeCallsEnd(script.linkUp());
        Options options;
        options.groups = {{"A", "B"}};
        const Finding finding = massClearIn(script, options);
        EXPECT_EQ(finding.dChannel, calls);
        EXPECT_EQ(finding.sentence.find("link-flap") != std::string::npos, calls == "B") << finding.sentence;
    }
}

TEST(Patterns, BlameTheEventOfTheLinkBeforeTheCallsEndedAndNotTheNext) {
    CallScript script;
    script.at(0).linkUp();
    threeCallsBegin(script);
    releaseLink(script.at(9000));
    threeCallsEnd(script.linkUp());
    releaseLink(script.at(9100));
    EXPECT_EQ(massClearIn(script).sentence, "3 calls ended with the link, which was set up here: 1, 2, 3");
}

TEST(Patterns, BlameNoLinkForCallsThatAreSuspendedOrReplaced) {
    for (const bool suspended : {false, true}) {
        CallScript script;
        script.at(0).linkUp();
        threeCallsBegin(script);
        releaseLink(script.at(9000));
        script.linkUp();
        for (std::uint8_t i = 1; i <= 3; ++i) {
            if (suspended)
                script.us(m::suspend, i, false, {callIdentity(i)}).peer(m::suspendAcknowledge, i, true);
            else
                script.us(m::setup, i, false, {bearerSpeech(), channel(static_cast<std::uint8_t>(9 + i))});
        }
        EXPECT_EQ(patternsIn(script).find("mass-clear"), std::string::npos) << patternsIn(script);
    }
}

TEST(Patterns, ReportLostCallsAsAnErrorIfOnlyAWarningOfTheLinkExplainsThem) {
    CallScript script;
    script.at(0).linkUp();
    for (std::uint16_t i = 1; i <= 3; ++i) {
        script.at(i * 100).us(m::setup, i, false, {bearerSpeech(), channel(static_cast<std::uint8_t>(i))});
        script.at(i * 100 + 10).peer(m::connect, i, true);
    }
    script.at(8900).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
    script.at(9000).raw(Side::us, true, {0x7F}).raw(Side::peer, false, {0x1F});  // SABME, DM
    script.at(9010).linkUp();
    for (std::uint16_t i = 1; i <= 3; ++i)
        script.at(9100).peer(m::releaseComplete, i, true, {cause(41)});
    Collected collected;
    analyse(script, collected, 400000);
    ASSERT_EQ(collected.lines, "12 link-refused\n14 mass-clear\n");
    EXPECT_EQ(collected.findings.front().severity, Severity::warning);
    EXPECT_EQ(collected.findings.back().severity, Severity::error);
}

TEST(Patterns, SayWhatTheCauseOfABurstIsAbout) {
    struct {
        std::uint8_t cause;
        const char* says;
    } const cases[] = {
        {1, "cause 1 in 5 calls within a minute, to numbers that begin with \"0033\"; number unknown/ISDN"},
        {34, "cause 34 in 5 calls within a minute, to numbers that begin with \"0033\""},
        {58,
         "cause 58 in 5 calls within a minute, to numbers that begin with \"0033\"; bearer 64k unrestricted"},
    };
    for (const auto& each : cases) {
        CallScript script;
        for (std::uint16_t i = 0; i < 5; ++i) {
            script.at(1000 + i * 5000).us(m::setup, i + 2, false, {bearer64k(), called("003312")});
            script.peer(m::releaseComplete, i + 2, true, {cause(each.cause, 2)});
        }
        Collected collected;
        analyse(script, collected);
        ASSERT_EQ(collected.findings.size(), 1U) << collected.lines;
        EXPECT_EQ(collected.findings[0].sentence, each.says);
    }
}

}  // namespace calls
