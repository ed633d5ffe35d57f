#include "reader/command_line.h"

#include <gtest/gtest.h>

#include <set>

#include "reader/errors.h"

namespace reader {
namespace {

using Words = std::vector<std::string>;
using Set = std::set<std::string>;

// "--not --callref 5" as "!callref=5". Their order means nothing.
std::set<std::string> filters(const Words& words) {
    std::set<std::string> told;
    for (const FilterWord& word : parseCommandLine(words).options.filters)
        told.insert(std::string(word.negated ? "!" : "") + word.name + "=" + word.value);
    return told;
}

TEST(CommandLine, WithoutACommandLists) {
    EXPECT_EQ(parseCommandLine({"a.log"}).command->name, "list");
    EXPECT_EQ(parseCommandLine({"--wide", "a.log"}).command->name, "list");
    EXPECT_EQ(parseCommandLine({}).command->name, "list");
    EXPECT_EQ(parseCommandLine({"./list"}).options.words, Words{"./list"});
}

TEST(CommandLine, KnowsEachCommand) {
    for (const Command& command : commands())
        EXPECT_EQ(parseCommandLine({std::string(command.name), "a.log"}).command, &command);
}

TEST(CommandLine, TakesLettersThatPeopleHaveInTheirFingers) {
    const Options options =
        parseCommandLine({"list", "-r", "a.log", "-w", "out.txt", "-l", "-q", "-i", "fifo", "b.log", "-"})
            .options;
    EXPECT_EQ(options.input.files, (Words{"a.log", "fifo"}));
    EXPECT_TRUE(options.input.follow);
    EXPECT_EQ(options.words, (Words{"b.log", "-"}));
    EXPECT_EQ(options.output.path, "out.txt");
    EXPECT_TRUE(options.output.lineBuffered);
    EXPECT_EQ(options.loudness, Loudness::quiet);
    EXPECT_EQ(parseCommandLine({"-v", "a"}).options.loudness, Loudness::verbose);
}

TEST(CommandLine, KeepsFiltersAndWhetherTheyAreNegated) {
    EXPECT_EQ(filters({"--message", "SETUP,CONNECT", "--not", "--callref", "5", "a.log"}),
              (Set{"message=SETUP,CONNECT", "!callref=5"}));
    EXPECT_EQ(filters({"--not", "--callref=5", "--callref=6", "a.log"}), (Set{"!callref=5", "callref=6"}));
    EXPECT_EQ(filters({"--no-keepalive", "--not", "--no-keepalive", "a.log"}),
              (Set{"no-keepalive=", "!no-keepalive="}));
    EXPECT_EQ(filters({"--not", "--not", "--tei", "5", "a.log"}), Set{"tei=5"});
}

TEST(CommandLine, SaysWhichCommandAMistypedWordMayMean) {
    const auto meant = [](const std::string& word) {
        try {
            parseCommandLine({word, "a.log"});
            return std::string();
        } catch (const UsageError& error) {
            return std::string(error.what());
        }
    };
    for (const auto& [word, command] : {std::pair("lst", "list"),
                                        {"lsit", "list"},
                                        {"ckeck", "check"},
                                        {"convrt", "convert"},
                                        {"explian", "explain"},
                                        {"recrods", "record"}})
        EXPECT_EQ(meant(word),
                  std::string("there is no file and no command ") + word + "; did you mean " + command + "?");
    for (const std::string word : {"day.log", "a", "list.log", "trunk1", "-", "ls", "explained-again"})
        EXPECT_EQ(meant(word), "") << word;
}

TEST(CommandLine, RefusesOptionsOfWhichOnlyOneCanHold) {
    for (const Words& words : {Words{"calls", "--csv", "--jsonl"},
                               {"stats", "--jsonl", "--csv"},
                               {"stats", "--e1", "--t1"},
                               {"stats", "--bri", "--e1"},
                               {"browse", "--e1", "--t1"},
                               {"list", "--relative", "--delta"},
                               {"list", "--wide", "--columns", "n"},
                               {"ladder", "--svg", "--mermaid"},
                               {"explain", "--frame", "--element"},
                               {"-q", "-v"}})
        EXPECT_THROW(parseCommandLine(words), UsageError) << words[0];
    EXPECT_NO_THROW(parseCommandLine({"stats", "--csv", "--e1"}));
}

TEST(CommandLine, RefusesNotInFrontOfAnythingElse) {
    EXPECT_THROW(parseCommandLine({"--not", "a.log"}), UsageError);
    EXPECT_THROW(parseCommandLine({"a.log", "--not"}), UsageError);
    EXPECT_THROW(parseCommandLine({"--not", "--wide", "a.log"}), UsageError);
    EXPECT_THROW(parseCommandLine({"--not", "--first", "0", "a.log"}), UsageError);
    const Options options = parseCommandLine({"--first", "5", "--not", "--first", "7", "a.log"}).options;
    EXPECT_EQ(options.first, 5U);
    EXPECT_EQ(options.skipped, 7U);
}

TEST(CommandLine, RefusesWhatItDoesNotKnow) {
    for (const Words& words : {Words{"--no-such-option"}, Words{"--color", "blue"}, Words{"--first", "0"},
                               Words{"--jobs", "0"}, Words{"--columns", "nosuch"}, Words{"--variant", "5"},
                               Words{"convert", "--to", "doc"}, Words{"-r"}})
        EXPECT_THROW(parseCommandLine(words), UsageError) << words[0];
}

TEST(CommandLine, HasHelpAndVersionForTheProgramAndEachCommand) {
    EXPECT_EQ(parseCommandLine({"--version"}).told.substr(0, 9), "lapdread ");
    const std::string all = parseCommandLine({"--help"}).told;
    for (const Command& command : commands()) {
        const std::string name(command.name);
        EXPECT_NE(all.find(name), std::string::npos) << name;
        const std::string told = parseCommandLine({name, "-h"}).told;
        EXPECT_NE(told.find("Usage: lapdread " + name + " [OPTIONS] " + std::string(command.words)),
                  std::string::npos)
            << told;
        EXPECT_NE(told.find("\nExamples:\n  lapdread "), std::string::npos) << name;
        EXPECT_EQ(parseCommandLine({name, "-V"}).told, parseCommandLine({"-V"}).told);
    }
}

TEST(CommandLine, HidesHowNegationIsHandedOver) {
    EXPECT_EQ(parseCommandLine({"list", "--help"}).told.find("--not-"), std::string::npos);
}

TEST(CommandLine, TakesWordsBehindTwoDashesAsFiles) {
    EXPECT_EQ(parseCommandLine({"list", "--", "--not", "-q"}).options.words, (Words{"--not", "-q"}));
}

}  // namespace
}  // namespace reader
