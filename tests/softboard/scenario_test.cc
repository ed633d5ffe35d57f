// Tests the sources of a scenario: settings, the scenario file, and the form in which it is handed over.
#include "softboard/scenario.h"

#include <gtest/gtest.h>

#include <cstring>

#include "softboard/command_line.h"
#include "softboard/settings.h"
#include "tests/softboard/temp_file.h"

namespace softboard {
namespace {

const std::string examples = LAPDMON_SOURCE_DIR "/examples/";

template <class Act>
std::string complaint(Act act) {
    try {
        act();
    } catch (const BadInput& error) {
        return error.what();
    }
    return "";
}

std::string write(const std::string& text) {
    static const TempFile file(".toml");
    return file.write(text);
}

TEST(SettingsTest, AProtocolIsANameOrANumber) {
    struct {
        const char* text;
        uint32_t value;
    } const cases[] = {{"4ess", 1}, {"5ess", 2}, {"dms100", 3}, {"ntt", 4},
                       {"net5", 7}, {"ni2", 12}, {"5", 5},      {"0", 0}};
    for (const auto& c : cases) {
        EXPECT_EQ(parseProtocol(c.text), c.value) << c.text;
    }
    for (const char* text : {"", "NET5", "net5 ", "-1", "4294967296", "7.0"}) {
        EXPECT_EQ(
            complaint([&] { parseProtocol(text); }),
            "\"" + std::string(text) + "\" is none of 4ess, 5ess, dms100, ntt, net5, ni2 and no number");
    }
}

TEST(SettingsTest, ARateIsRecordedMaxOrFramesPerSecond) {
    EXPECT_EQ(parseRate("recorded"), (Rate{Rate::Kind::recorded, 0}));
    EXPECT_EQ(parseRate("max"), (Rate{Rate::Kind::max, 0}));
    EXPECT_EQ(parseRate("0.5"), (Rate{Rate::Kind::perSecond, 0.5}));
    for (const char* text : {"", "fast", "3x", "+"}) {
        EXPECT_EQ(complaint([&] { parseRate(text); }),
                  "\"" + std::string(text) + "\" is neither recorded, max nor a number of frames per second");
    }
    for (const char* text : {"0", "-3", "nan", "inf", "1e-7", "1000001"}) {
        EXPECT_EQ(complaint([&] { parseRate(text); }),
                  "frames per second must be at least 0.000001 and at most 1000000")
            << text;
    }
}

TEST(ScenarioTest, WithoutSettingsTheBuiltinCapturePlaysAgainAndAgain) {
    EXPECT_EQ(resolve({}, {}, nullptr), builtinScenario());
    const DChannel channel = builtinScenario().channels.at(0);
    EXPECT_EQ(channel.board, 1);
    EXPECT_EQ(channel.number, 1);
    EXPECT_EQ(channel.protocol, 7U);
    EXPECT_TRUE(channel.loop);
}

TEST(ScenarioTest, OnlyTheBuiltinCaptureAtRecordedRateLoopsByItself) {
    Settings settings;
    settings.rate = parseRate("max");
    EXPECT_FALSE(resolve(settings, {}, nullptr).channels[0].loop);
    settings = {};
    settings.frames = examples + "ni2.pcap";
    EXPECT_FALSE(resolve(settings, {}, nullptr).channels[0].loop);
    settings.loop = true;
    EXPECT_TRUE(resolve(settings, {}, nullptr).channels[0].loop);
}

TEST(ScenarioTest, SettingsGoForEveryNumberedDChannel) {
    Settings settings;
    settings.board = 5;
    settings.protocol = ni2;
    settings.frames = examples + "ni2.pcap";
    const Scenario scenario = resolve(settings, 3, nullptr);
    ASSERT_EQ(scenario.channels.size(), 3U);
    EXPECT_EQ(scenario.captures.size(), 1U);
    EXPECT_EQ(scenario.channels[2].number, 3);
    EXPECT_EQ(scenario.channels[2].board, 5);
    EXPECT_EQ(scenario.channels[2].protocol, 12U);
}

TEST(ScenarioTest, AFileGivesEachDChannelFramesAndProtocolOfItsOwn) {
    const ScenarioFile file = readScenarioFile(examples + "two-dchannels.toml");
    const Scenario scenario = resolve({}, {}, &file);
    ASSERT_EQ(scenario.channels.size(), 2U);
    ASSERT_EQ(scenario.captures.size(), 2U);
    const DChannel& first = scenario.channels[0];
    const DChannel& second = scenario.channels[1];
    EXPECT_EQ(first.number, 1);
    EXPECT_EQ(first.protocol, 7U);
    EXPECT_EQ(first.rate.kind, Rate::Kind::recorded);
    EXPECT_TRUE(first.loop);
    EXPECT_EQ(scenario.captures[first.capture], builtinFrames());
    EXPECT_EQ(second.number, 2);
    EXPECT_EQ(second.protocol, 1U);
    EXPECT_EQ(second.rate, (Rate{Rate::Kind::perSecond, 10}));
    EXPECT_TRUE(second.loop);
}

TEST(ScenarioTest, TheCommandLineComesBeforeTheFilesGeneralSettingsAndADChannelsOwnBeforeBoth) {
    const ScenarioFile file =
        readScenarioFile(write("protocol = \"ntt\"\nboard = 2\nlabel = 3\njournal = \"j\"\n"
                               "[[dchannel]]\nnumber = 4\nprotocol = 99\n[[dchannel]]\n"));
    Settings commandLine;
    commandLine.protocol = dms100;
    commandLine.loop = false;
    const Scenario scenario = resolve(commandLine, {}, &file);
    EXPECT_EQ(scenario.channels[0].number, 4);
    EXPECT_EQ(scenario.channels[0].protocol, 99U);
    EXPECT_EQ(scenario.channels[1].number, 5);
    EXPECT_EQ(scenario.channels[1].protocol, 3U);
    EXPECT_EQ(scenario.channels[1].board, 2);
    EXPECT_EQ(scenario.channels[1].label, 3U);
    EXPECT_FALSE(scenario.channels[1].loop);
    EXPECT_EQ(scenario.journal, testing::TempDir() + "j");
}

TEST(ScenarioTest, FaultsOfTheCommandLineComeBesideThoseOfTheFile) {
    CommandLine commandLine = parseCommandLine({"--fault", "burst=7", "--fault", "silent", "--", "true"});
    commandLine.scenario = write("faults = [\"reply-lost=2\", \"reply-lost=3\"]\n");
    const std::vector<Fault> both{{FaultKind::replyLost, 2},
                                  {FaultKind::replyLost, 3},
                                  {FaultKind::burst, 7},
                                  {FaultKind::silent, 100}};
    EXPECT_EQ(scenarioOf(commandLine).faults, both);
    commandLine.scenario = write("faults = []\n");
    EXPECT_EQ(scenarioOf(commandLine).faults.size(), 2U);
}

TEST(ScenarioTest, ABadFileIsRefusedWithItsPlaceAndTheReason) {
    struct {
        const char* text;
        const char* reason;
    } const cases[] = {
        {"board = 1\nboard = 2\n", ":2:"},
        {"loop = maybe\n", ":1:"},
        {"loop = \"yes\"\n", ":1: loop: must be true or false"},
        {"\nboard = 256\n", ":2: board: must be a number from 0 to 255"},
        {"board = 1.5\n", ":1: board: must be a number from 0 to 255"},
        {"dchannels = 0\n", ":1: dchannels: must be a number from 1 to 255"},
        {"rate = \"fast\"\n",
         ":1: rate: \"fast\" is neither recorded, max nor a number of frames per second"},
        {"rate = 0\n", ":1: rate: frames per second must be at least 0.000001 and at most 1000000"},
        {"rate = true\n", ":1: rate: must be a name or a number"},
        {"protocol = -1\n", ":1: protocol: must be a name or a number"},
        {"protocol = \"q\"\n",
         ":1: protocol: \"q\" is none of 4ess, 5ess, dms100, ntt, net5, ni2 and no number"},
        {"frames = 3\n", ":1: frames: must be a text in quotes"},
        {"speed = 3\n", ":1: speed: is not a setting"},
        {"faults = \"burst\"\n", ":1: faults: must be a list of texts in quotes"},
        {"faults = [1]\n", ":1: faults: must be a list of texts in quotes"},
        {"faults = [\"burst\",\n\"late\"]\n",
         ":2: faults: there is no fault \"late\" (softboard --help lists them)"},
        {"[[dchannel]]\nfaults = []\n", ":2: faults: is not a setting"},
        {"dchannel = 3\n", ":1: dchannel: must be written as [[dchannel]]"},
        {"[[dchannel]]\nnumber = 0\n", ":2: number: must be a number from 1 to 65535"},
        {"[[dchannel]]\ndchannels = 2\n", ":2: dchannels: is not a setting"},
    };
    for (const auto& c : cases) {
        const std::string path = write(c.text);
        const std::string said = complaint([&] { readScenarioFile(path); });
        EXPECT_EQ(said.substr(0, path.size() + std::strlen(c.reason)), path + c.reason);
    }
    EXPECT_EQ(complaint([] { readScenarioFile("/nowhere.toml"); }),
              "/nowhere.toml: No such file or directory");
    EXPECT_EQ(complaint([] { readScenarioFile("/"); }), "/: Is a directory");
}

TEST(ScenarioTest, SettingsThatContradictEachOtherAreRefused) {
    std::string path = write("[[dchannel]]\n[[dchannel]]\nnumber = 1\n");
    const ScenarioFile twice = readScenarioFile(path);
    EXPECT_EQ(complaint([&] { resolve({}, {}, &twice); }), path + ":2: board 1 has D channel 1 already");
    path = write("[[dchannel]]\n");
    const ScenarioFile listed = readScenarioFile(path);
    EXPECT_EQ(complaint([&] { resolve({}, 2, &listed); }),
              path + ": it lists its D channels one by one; dchannels cannot be given as well");
    path = write("frames = \"gone.pcap\"\n");
    const ScenarioFile gone = readScenarioFile(path);
    EXPECT_EQ(complaint([&] { resolve({}, {}, &gone); }),
              testing::TempDir() + "gone.pcap: No such file or directory");
}

TEST(HandoverTest, AScenarioComesBackAsItWas) {
    Scenario scenario =
        oneChannel({{true, 7, {0x00, 0xff}}, {false, 4294967295U, {}}}, {Rate::Kind::perSecond, 2.5});
    scenario.captures.push_back(builtinFrames());
    scenario.channels.push_back({9, 65535, 12, {Rate::Kind::recorded, 0}, true, 3, 1});
    scenario.faults = {{FaultKind::replyLost, 3}, {FaultKind::neverWaits, 0}};
    scenario.journal = "/tmp/a \"name\"";
    EXPECT_EQ(fromJson(toJson(scenario)), scenario);
}

TEST(HandoverTest, AJournalsPathMayHoldOctetsThatAreNoUtf8) {
    Scenario scenario = oneChannel({});
    scenario.journal =
        "/tmp/gespr\xe4"
        "ch.txt";
    EXPECT_EQ(fromJson(toJson(scenario)).journal,
              "/tmp/gespr\xe4"
              "ch.txt");
}

TEST(HandoverTest, ATextThatIsNoScenarioIsRefused) {
    for (const char* text :
         {"", "{}", "[]", "{\"journal\":\"\",\"captures\":[],\"channels\":[{}]}", "\x00\xff"}) {
        EXPECT_THROW(fromJson(text), std::exception) << text;
    }
    Scenario scenario = oneChannel({});
    scenario.captures.clear();
    EXPECT_THROW(fromJson(toJson(scenario)), std::runtime_error);
}

TEST(HandoverTest, NumbersThatDoNotFitAreRefused) {
    const std::string good = toJson(oneChannel({{true, 7, {}}}, {Rate::Kind::perSecond, 2.5}));
    ASSERT_EQ(fromJson(good).channels.size(), 1U);
    const std::vector<std::pair<std::string, std::string>> wrong{
        {"\"protocol\":7", "\"protocol\":1e99"},
        {"\"protocol\":7", "\"protocol\":7.5"},
        {"\"protocol\":7", "\"protocol\":-1"},
        {"\"board\":1", "\"board\":256"},
        {"\"number\":1", "\"number\":65536"},
        {"\"label\":2", "\"label\":4294967296"},
        {"\"ticks\":7", "\"ticks\":\"7\""},
        {"\"capture\":0", "\"capture\":1"},
        {"\"rate\":1", "\"rate\":3"},
        {"\"perSecond\":2.5", "\"perSecond\":1e-300"},
    };
    for (const auto& [from, to] : wrong) {
        std::string text = good;
        ASSERT_NE(text.find(from), std::string::npos) << from;
        text.replace(text.find(from), from.size(), to);
        EXPECT_THROW(fromJson(text), std::exception) << to;
    }
}

}  // namespace
}  // namespace softboard
