#include "reader/json.h"

#include <gtest/gtest.h>

namespace reader {
namespace {

std::string json(std::string_view text) {
    std::string line;
    appendJsonString(line, text);
    return line;
}

TEST(JsonString, EscapesWhatJsonDoesNotAllow) {
    EXPECT_EQ(json("a\"b\\c"), R"("a\u0022b\u005cc")");
    EXPECT_EQ(json(std::string_view("\x00\x1b\n\x7f", 4)), R"("\u0000\u001b\u000a\u007f")");
}

TEST(JsonString, IsValidWhateverTheOctetsAre) { EXPECT_EQ(json("\xe4\xff"), R"("\u00e4\u00ff")"); }

}  // namespace
}  // namespace reader
