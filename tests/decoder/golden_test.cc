// Every golden case of the decoder: octets in, the whole text out. UPDATE_GOLDEN=1 rewrites the texts that
// differ; the change is reviewed like code.
#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <map>
#include <set>
#include <sstream>

#include "golden_cases.h"

namespace {

bool updating() {
    const char* set = std::getenv("UPDATE_GOLDEN");
    return set != nullptr && std::string_view(set) == "1";
}

void write(const golden::File& file) {
    std::ofstream out(file.path, std::ios::binary);
    for (const std::string& line : file.lines)
        out << line << "\n";
}

class GoldenFile : public testing::TestWithParam<std::string> {
  protected:
    // Runs the case on each of its trunks. What differs is reported, or put into the file when every trunk
    // shows the same.
    void check(golden::File& file, const golden::Case& kase) {
        std::map<std::string, std::string> trunksByText;
        for (const golden::Trunk& trunk : kase.on) {
            const golden::Outcome outcome = golden::run(kase, trunk);
            const std::string where = place(file, kase) + " (" + std::string(trunk.name) + ")";
            EXPECT_EQ(outcome.left, kase.left) << where << ": octets left in the cursor";
            EXPECT_EQ(outcome.flag, kase.transmitted ? 0 : 1) << where;
            EXPECT_EQ(outcome.swit, trunk.variant) << where;
            trunksByText[outcome.text].append(" ").append(trunk.name);
        }
        if (updating() && trunksByText.size() == 1 && trunksByText.begin()->first != kase.expected)
            return golden::replaceText(file, kase, trunksByText.begin()->first);
        for (const auto& [text, on] : trunksByText) {
            if (text != kase.expected)
                ADD_FAILURE() << place(file, kase) << " (on" << on << ")\n"
                              << golden::difference(kase.expected, text);
        }
    }

    static std::string place(const golden::File& file, const golden::Case& kase) {
        return file.path + ":" + std::to_string(kase.line) + ": " + kase.sentence;
    }
};

TEST_P(GoldenFile, ShowsForEveryCaseTheTextBesideIt) {
    golden::File file = golden::read(GetParam());
    ASSERT_FALSE(file.cases.empty());
    // From the last to the first, so that a rewritten text does not move those that are still to come.
    for (auto kase = file.cases.rbegin(); kase != file.cases.rend(); ++kase)
        check(file, *kase);
    if (updating())
        write(file);
}

INSTANTIATE_TEST_SUITE_P(Decoder, GoldenFile, testing::ValuesIn(golden::names()),
                         [](const auto& file) { return file.param; });

TEST(GoldenFiles, EveryElementDecoderHasOneOfItsName) {
    const std::string text = golden::contentsOf(LAPDMON_SOURCE_DIR "/decoder/elements.h");
    std::set<std::string> missing;
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        const std::size_t parameters = line.find("(unsigned char id");
        if (line.starts_with("void ") && parameters != std::string::npos)
            missing.insert(line.substr(5, parameters - 5));
    }
    EXPECT_GE(missing.size(), 35U);
    for (const std::string& name : golden::names())
        missing.erase(name);
    EXPECT_EQ(missing, std::set<std::string>());
}

TEST(GoldenFiles, ASentenceStandsOnceInAFile) {
    for (const std::string& name : golden::names()) {
        std::set<std::string> seen;
        for (const golden::Case& kase : golden::read(name).cases)
            EXPECT_TRUE(seen.insert(kase.sentence).second) << name << ":" << kase.line;
    }
}

TEST(GoldenFormat, TextsOfEveryOctetComeBackAsTheyWere) {
    std::string every;
    for (int octet = 0; octet < 256; ++octet)
        every += static_cast<char>(octet);
    for (const std::string& text : {std::string(), std::string("\n"), std::string("\n\n  "), every,
                                    std::string("..\n..\n"), std::string("\\"), std::string("\\\n")}) {
        const std::vector<std::string> lines = golden::escape(text);
        EXPECT_EQ(golden::unescape(lines), text);
        for (const std::string& line : lines)
            EXPECT_NE(line, "..");
    }
}

TEST(GoldenFormat, ARewrittenCaseLeavesTheRestOfTheFile) {
    const std::string before =
        "# why\n\n== a\ntrunk all\noctets A1\n--\nold\n..\n\n== b\ntrunk ntt\noctets A0\n--\n..\n";
    golden::File file = golden::parse("x.golden", before);
    golden::replaceText(file, file.cases.at(0), "new\nlast");
    const std::vector<std::string> after{"# why", "", "== a", "trunk all", "octets A1", "--", "new", "last\\",
                                         "..",    "", "== b", "trunk ntt", "octets A0", "--", ".."};
    EXPECT_EQ(file.lines, after);
}

TEST(GoldenFormat, AMistakeIsReportedWithItsLine) {
    struct {
        const char* says;
        const char* contents;
    } const mistakes[] = {
        {"f:1: expected a line \"== sentence\"", "trunk all\n"},
        {"f:2: unknown trunk \"net9\"", "== a\ntrunk net9\n"},
        {"f:2: \"1\" is no octet", "== a\noctets 1\n"},
        {"f:2: \"a1\" is no octet", "== a\noctets a1\n"},
        {"f:2: unknown word \"octet\"", "== a\noctet A1\n"},
        {"f:2: a direction is rx or tx", "== a\ndirection out\n"},
        {"f:2: no decoder \"signal\" to call directly", "== a\ndecoder signal\n"},
        {"f:2: unreadable value of \"left\"", "== a\nleft over\n"},
        {"f:3: the case names no trunk or no octets", "== a\ntrunk all\n--\n"},
        {"f:4: the case has no end", "== a\ntrunk all\noctets A1\n"},
        {"f:6: the case has no end", "== a\ntrunk all\noctets A1\n--\ntext\n"},
        {"f:6: unknown escape \"\\q\"", "== a\ntrunk all\noctets A1\n--\n\\q\n..\n"},
    };
    for (const auto& mistake : mistakes) {
        try {
            golden::parse("f", mistake.contents);
            ADD_FAILURE() << "not reported: " << mistake.says;
        } catch (const std::runtime_error& error) {
            EXPECT_STREQ(error.what(), mistake.says);
        }
    }
}

}  // namespace
