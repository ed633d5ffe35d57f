// Each trap: its frames stand in a file, on which the program's own tests run `check`; they show no warning;
// and those of a trunk at fault in the same place do.
#include "tests/calls/traps.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "tests/calls/analysed.h"

namespace calls {

namespace {

using namespace test;

// The first frame's second: 2026-01-05 08:00:00 UTC.
constexpr std::int64_t began = 1767600000;

std::string timeOf(std::int64_t at) {
    const std::time_t seconds = began + at / second;
    std::tm utc{};
    gmtime_r(&seconds, &utc);
    char date[32];
    std::strftime(date, sizeof date, "%Y-%m-%dT%H:%M:%S", &utc);
    std::string milliseconds = std::to_string(at % second / millisecond);
    milliseconds.insert(0, 3 - milliseconds.size(), '0');
    return std::string(date) + "." + milliseconds + "Z";
}

// The frames of one D channel as lines of hexadecimal digits.
std::string linesOf(const CallScript& script, std::string_view says, const std::string& dChannel) {
    std::string text = "# " + std::string(says) + "\n";
    for (const Sent& sent : script.frames()) {
        if (sent.frame.interface->name != dChannel)
            continue;
        text += (sent.frame.transmitted ? "TX " : "RX ") + timeOf(sent.at) + " ";
        for (const std::uint8_t octet : sent.octets) {
            constexpr std::string_view digits = "0123456789abcdef";
            text += {digits[octet >> 4U], digits[octet & 15U]};
        }
        text += '\n';
    }
    return text;
}

void compareWithFile(const std::string& name, const std::string& text) {
    const std::filesystem::path path =
        std::string(LAPDMON_SOURCE_DIR "/tests/reader/data/traps/") + name + ".hex";
    const char* const update = std::getenv("UPDATE_GOLDEN");
    if (update != nullptr && std::string_view(update) == "1")
        std::ofstream(path) << text;
    std::stringstream written;
    written << std::ifstream(path).rdbuf();
    EXPECT_EQ(written.str(), text) << path;
}

std::string warningsIn(const CallScript& script, const Options& options = {}) {
    Collected collected;
    Analysis analysis(options, collected);
    std::uint64_t number = 0;
    for (const Sent& sent : script.frames())
        analysis.take(sent.frame, ++number);
    analysis.finish();
    std::string lines;
    for (const Finding& finding : collected.findings) {
        if (finding.severity != Severity::note)
            lines += std::to_string(finding.frame) + " " + std::string(finding.kind->id) + "\n";
    }
    return lines;
}

// Two D channels share their calls, and the second takes over.
CallScript changeover() {
    namespace m = isdn::message;
    CallScript script(capture::Role::user);
    script.on("changeover-a").at(0).linkUp().on("changeover-b").linkUp();
    script.on("changeover-a").at(100).us(m::setup, 1, false, {bearerSpeech(), channel(1), called("4021")});
    script.at(150).peer(m::callProceeding, 1, true, {channel(1)});
    script.at(900).peer(m::connect, 1, true).us(m::connectAcknowledge, 1, false);
    for (int i = 1; i < 5; ++i)
        script.on("changeover-b").at(i * 10000).poll(Side::us).on("changeover-a").poll(Side::us);
    script.at(50000).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
    script.on("changeover-b").at(60000).us(m::disconnect, 1, false, {cause(16)});
    script.peer(m::release, 1, true).us(m::releaseComplete, 1, false);
    for (int i = 7; i < 20; ++i)
        script.at(i * 10000).poll(Side::us);
    return script;
}

}  // namespace

TEST(Traps, ShowNoWarning) {
    for (const Trap& trap : traps()) {
        CallScript script(trap.role);
        trap.tell(script, false);
        EXPECT_EQ(warningsIn(script), "") << trap.name;
    }
}

TEST(Traps, ShowTheFaultOnceItIsReallyThere) {
    for (const Trap& trap : traps()) {
        CallScript script(trap.role);
        trap.tell(script, true);
        const std::string found = warningsIn(script);
        EXPECT_NE(found.find(" " + std::string(trap.spoiltShows->id) + "\n"), std::string::npos)
            << trap.name << ":\n"
            << found;
    }
}

TEST(Traps, AreTheSameInTheirFiles) {
    for (const Trap& trap : traps()) {
        CallScript script(trap.role);
        trap.tell(script, false);
        compareWithFile(std::string(trap.name),
                        linesOf(script, trap.says, script.frames()[0].frame.interface->name));
    }
}

// The first D channel's link stays down for much longer than T309.
TEST(Traps, ACallOutlivesTheLinkOfADChannelWhileAnotherOfItsGroupHasOne) {
    namespace m = isdn::message;
    for (const bool bothDown : {false, true}) {
        CallScript script(capture::Role::user);
        script.on("a").at(0).linkUp().on("b").linkUp();
        script.on("a").at(100).us(m::setup, 1, false, {bearerSpeech(), channel(1), called("4021")});
        script.at(900).peer(m::connect, 1, true).us(m::connectAcknowledge, 1, false);
        script.at(10000).raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});  // DISC, UA
        script.on("b").at(20000).poll(Side::us);
        if (bothDown)
            script.raw(Side::peer, true, {0x53}).raw(Side::us, false, {0x73});
        script.at(100000).on("a").raw(Side::us, true, {0x7F}).on("b").at(119000);
        if (bothDown)
            script.raw(Side::us, true, {0x7F});
        else
            script.poll(Side::us).at(200000).us(m::disconnect, 1, false, {cause(16)});
        Options options;
        options.groups = {{"a", "b"}};
        Collected collected;
        Analysis analysis(options, collected);
        std::uint64_t number = 0;
        for (const Sent& sent : script.frames())
            analysis.take(sent.frame, ++number);
        analysis.finish();
        ASSERT_EQ(collected.calls.size(), 1U);
        EXPECT_EQ(nameOf(collected.calls.front().endedBy), bothDown ? "link" : "open");
        EXPECT_EQ(collected.calls.front().clearingSeen, !bothDown);
    }
}

TEST(Traps, AChangeoverIsNoFaultWhereTheDChannelsShareTheirCalls) {
    const CallScript script = changeover();
    for (const char* const name : {"changeover-a", "changeover-b"})
        compareWithFile(name,
                        linesOf(script, "one of two D channels that share their calls; -b takes over", name));
    Options options;
    options.groups = {{"changeover-a", "changeover-b"}};
    EXPECT_EQ(warningsIn(script, options), "");
}

}  // namespace calls
