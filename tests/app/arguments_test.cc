#include "app/arguments.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "decoder/state.h"
#include "tests/app/channels.h"

namespace app {
namespace {

using ::testing::Eq;
using ::testing::ExitedWithCode;

using Words = std::vector<std::string>;

constexpr char usage[] =
    "syntax: lapdmon -b# [-f xxxx] [-d#]\n"
    "   -b#      - board number, required\n"
    "   -d#      - D-Channel number, optional, default is 1\n"
    "   -f name  - Enable logging to file, optional \n"
    "   -h       - this message\n"
    "\n";

void parse(Words words) {
    std::string program = "lapdmon";
    std::vector<char*> argv{program.data()};
    for (std::string& word : words)
        argv.push_back(word.data());
    argv.push_back(nullptr);
    parseArgs(static_cast<int>(argv.size()) - 1, argv.data());
}

// In the process of a death test, where the screen cannot be looked at afterwards.
void parseOnStandardError(const Words& words) {
    std::cout.rdbuf(std::cerr.rdbuf());
    parse(words);
}

struct Parsed {
    int board, dchannel;
    std::string file, screen;

    bool operator==(const Parsed&) const = default;
    friend std::ostream& operator<<(std::ostream& out, const Parsed& p) {
        return out << "board " << p.board << ", D channel " << p.dchannel << ", file " << p.file
                   << ", screen " << p.screen;
    }
};

Parsed parsed(const Words& words) {
    boardnumber = 0;
    INST_NUM = 99;
    log_file_name.fill('?');
    const testing::Screen screen;
    parse(words);
    return {boardnumber, INST_NUM, log_file_name.data(), screen.text()};
}

struct Case {
    const char* says;
    Words words;
    int board, dchannel;
    std::string file;
};

void expectEach(const std::vector<Case>& cases) {
    for (const Case& each : cases) {
        const Parsed expected{each.board, each.dchannel, each.file, "filename: " + each.file + "\n"};
        EXPECT_EQ(parsed(each.words), expected) << each.says;
    }
}

TEST(Arguments, AreReadFromTheDigitsRightAfterTheLetter) {
    expectEach({
        {"the board alone", {"-b1"}, 1, 1, "lapdmon.log"},
        {"the D channel before the board", {"-d2", "-b1"}, 1, 2, "lapdmon.log"},
        {"capital letters", {"-B3", "-D4"}, 3, 4, "lapdmon.log"},
        {"the other letter for the D channel", {"-b1", "-i5"}, 1, 5, "lapdmon.log"},
        {"the other letter as a capital", {"-b1", "-I6"}, 1, 6, "lapdmon.log"},
        {"more than one digit", {"-b12", "-d34"}, 12, 34, "lapdmon.log"},
        {"what follows the digits is passed over", {"-b1x", "-d2y"}, 1, 2, "lapdmon.log"},
        {"signs count, blanks do not", {"-b-7", "-d +8"}, -7, 8, "lapdmon.log"},
        {"the last of several", {"-b1", "-b2", "-d3", "-d4"}, 2, 4, "lapdmon.log"},
    });
}

TEST(Arguments, ThatAreNoNumbersLeaveTheSettingsAsTheyAre) {
    expectEach({
        {"a board without a number", {"-b"}, 0, 1, "lapdmon.log"},
        {"letters for the board", {"-bone"}, 0, 1, "lapdmon.log"},
        {"letters for the D channel", {"-b1", "-dtwo"}, 1, 1, "lapdmon.log"},
        {"a board that was read before", {"-b3", "-bx"}, 3, 1, "lapdmon.log"},
    });
}

TEST(Arguments, EndAtTheFirstWordThatIsNoOption) {
    expectEach({
        {"a number as a word of its own", {"-b", "1"}, 0, 1, "lapdmon.log"},
        {"options after a word", {"-b1", "word", "-d2"}, 1, 1, "lapdmon.log"},
        {"an empty word", {"-b1", "", "-d2"}, 1, 1, "lapdmon.log"},
        {"even a help request", {"-b1", "word", "-h"}, 1, 1, "lapdmon.log"},
    });
}

TEST(Arguments, NameTheLogOneCharacterPastTheLetter) {
    expectEach({
        {"in the next word, which ends the options", {"-b1", "-f", "trace.txt", "-d2"}, 1, 1, "trace.txt"},
        {"in the last word", {"-b1", "-d2", "-f", "trace.txt"}, 1, 2, "trace.txt"},
        {"a capital letter", {"-b1", "-F", "trace.txt"}, 1, 1, "trace.txt"},
        {"joined: the character after the letter is passed over", {"-b1", "-ftrace.txt"}, 1, 1, "race.txt"},
        {"joined: the options go on", {"-b1", "-fxtrace.txt", "-d2"}, 1, 2, "trace.txt"},
        {"letter, blank and name in one word", {"-b1", "-f trace.txt"}, 1, 1, "trace.txt"},
        {"blanks before the name", {"-b1", "-f", " \ttrace.txt"}, 1, 1, "trace.txt"},
        {"a blank ends the name", {"-b1", "-f", "my trace.txt"}, 1, 1, "my"},
        {"a name that looks like an option is both", {"-b1", "-f", "-d2"}, 1, 2, "-d2"},
        {"the last of several", {"-b1", "-fxone", "-fxtwo"}, 1, 1, "two"},
    });
}

TEST(Arguments, WithoutAFileNameKeepTheDefault) {
    expectEach({
        {"-f as the last word", {"-b1", "-f"}, 1, 1, "lapdmon.log"},
        {"an empty word follows", {"-b1", "-f", ""}, 1, 1, "lapdmon.log"},
        {"a blank word follows", {"-b1", "-f", "  "}, 1, 1, "lapdmon.log"},
        {"one joined character", {"-b1", "-fx", "-d2"}, 1, 2, "lapdmon.log"},
    });
}

TEST(Arguments, BoundAFileNameToTheArray) {
    EXPECT_EQ(parsed({"-b1", "-f", std::string(99, 'n')}).file, std::string(99, 'n'));
    EXPECT_EQ(parsed({"-b1", "-f", std::string(100, 'n')}).file, std::string(99, 'n'));
    EXPECT_EQ(parsed({"-b1", "-fx" + std::string(5000, 'n')}).file, std::string(99, 'n'));
}

TEST(Arguments, AlwaysSwitchTheLogOn) {
    decoder::file_output = false;
    parsed({"-b1"});
    EXPECT_TRUE(decoder::file_output);
    decoder::file_output = false;
}

class ArgumentsDeathTest : public ::testing::Test {
  protected:
    ArgumentsDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

void expectUsage(const Words& words, const std::string& before = "") {
    EXPECT_EXIT(parseOnStandardError(words), ExitedWithCode(0), Eq(before + usage))
        << ::testing::PrintToString(words);
}

TEST_F(ArgumentsDeathTest, WithoutABoardPrintTheUsageAndEndWithStatus0) {
    expectUsage({});
    expectUsage({"-d2"});
    expectUsage({"word", "-b1"});
    expectUsage({"-f", "trace.txt", "-b1"});
}

TEST_F(ArgumentsDeathTest, ThatAskForHelpPrintTheUsageWhateverElseTheySay) {
    expectUsage({"-h"});
    expectUsage({"-H", "-b1"});
    expectUsage({"-h", "-b1"});
    expectUsage({"-b1", "-h"});
    expectUsage({"-b1", "-?"});
    expectUsage({"-b1", "-help", "-b2"});
}

TEST_F(ArgumentsDeathTest, ThatAreUnknownSaySoBeforeTheUsage) {
    expectUsage({"-b1", "-x"}, "Unknown Option\n");
    expectUsage({"-x", "-b1"}, "Unknown Option\n");
    expectUsage({"-b1", "--help"}, "Unknown Option\n");
    expectUsage({"-b1", "-"}, "Unknown Option\n");
    expectUsage({"-x", "-b1", "-y"}, "Unknown Option\nUnknown Option\n");
}

}  // namespace
}  // namespace app
