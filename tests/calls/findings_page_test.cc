// The page of findings lists every kind as the program knows it. UPDATE_GOLDEN=1 writes its table.
#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <sstream>

#include "calls/Finding.h"

namespace calls {

namespace {

constexpr const char* page = LAPDMON_SOURCE_DIR "/docs/user/findings.md";
constexpr std::string_view begin = "<!-- findings -->\n", end = "<!-- end of findings -->\n";

std::string table() {
    std::string text = "| Finding | Severity | What it means | Look at | Clause |\n|---|---|---|---|---|\n";
    for (const FindingKind* const kind : findingKinds()) {
        text.append("| `").append(kind->id).append("` | ").append(nameOf(kind->severity));
        text.append(" | ").append(kind->meaning).append(" | ").append(kind->lookAt);
        text.append(" | ").append(kind->clause).append(" |\n");
    }
    return text;
}

std::string read() {
    std::stringstream text;
    text << std::ifstream(page).rdbuf();
    return text.str();
}

}  // namespace

TEST(FindingsPage, ListsEveryKindAsTheProgramKnowsIt) {
    std::string text = read();
    const std::size_t from = text.find(begin), to = text.find(end);
    ASSERT_NE(from, std::string::npos);
    ASSERT_NE(to, std::string::npos);
    const std::size_t first = from + begin.size();
    if (const char* const update = std::getenv("UPDATE_GOLDEN");
        update != nullptr && std::string(update) == "1") {
        text.replace(first, to - first, table());
        std::ofstream(page) << text;
    }
    text = read();
    EXPECT_EQ(text.substr(first, text.find(end) - first), table());
}

}  // namespace calls
