// The screens as text. golden/README.md describes the format.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "Stage.h"

namespace reader::browse::testing {
namespace {

struct Case {
    std::string sentence;
    std::string file;
    std::string keys;
    int width = 80, height = 24;
    bool utf8 = false;
    std::string expected;
    std::vector<std::string> head;  // its lines in the file, without the screen
};

std::vector<Case> casesIn(const std::string& path) {
    std::ifstream in(path);
    std::vector<Case> cases;
    for (std::string line; std::getline(in, line);) {
        if (!line.starts_with("== "))
            continue;
        Case each;
        each.sentence = line.substr(3);
        for (each.head.push_back(line); std::getline(in, line);) {
            each.head.push_back(line);
            if (line == "--")
                break;
            std::istringstream words(line);
            std::string word;
            words >> word >> std::ws;
            if (word == "file")
                std::getline(words, each.file);
            else if (word == "keys")
                std::getline(words, each.keys);
            else if (word == "utf8")
                each.utf8 = true;
            else if (char x = 0; word == "size")
                words >> each.width >> x >> each.height;
            else
                ADD_FAILURE() << path << ": " << line;
        }
        while (std::getline(in, line) && line != "..")
            each.expected += line + "\n";
        cases.push_back(std::move(each));
    }
    return cases;
}

class Golden : public ::testing::TestWithParam<std::string> {};

TEST_P(Golden, ScreensAreAsWrittenDown) {
    const std::string path = GetParam();
    std::vector<Case> cases = casesIn(path);
    ASSERT_FALSE(cases.empty());
    const bool update = std::getenv("UPDATE_GOLDEN") != nullptr;
    std::string all;
    for (const Case& each : cases) {
        SCOPED_TRACE(each.sentence);
        Stage stage(each.file, each.utf8);
        stage.press(each.keys);
        // The first drawing tells the cursor how much there is room for.
        stage.screen(each.width, each.height);
        const std::string shown = stage.screen(each.width, each.height);
        if (!update) {
            EXPECT_EQ(shown, each.expected);
        }
        for (const std::string& line : each.head)
            all += line + "\n";
        all += shown + "..\n\n";
    }
    if (update)
        std::ofstream(path) << all;
}

std::vector<std::string> goldenFiles() {
    std::vector<std::string> files;
    for (const auto& entry :
         std::filesystem::directory_iterator(LAPDMON_SOURCE_DIR "/tests/reader/browse/golden")) {
        if (entry.path().extension() == ".golden")
            files.push_back(entry.path());
    }
    std::sort(files.begin(), files.end());
    return files;
}

INSTANTIATE_TEST_SUITE_P(Screens, Golden, ::testing::ValuesIn(goldenFiles()),
                         [](const auto& each) { return std::filesystem::path(each.param).stem().string(); });

}  // namespace
}  // namespace reader::browse::testing
