#include "reader/text.h"

#include <gtest/gtest.h>

namespace reader {
namespace {

TEST(SafeText, IsMadeInPlaceFromAPlaceOn) {
    std::string text = "\x1b[1mkept, ";
    makeSafe(text, text.size());
    EXPECT_EQ(text, "\x1b[1mkept, ");
    text += "plain";
    makeSafe(text, 10);
    EXPECT_EQ(text, "\x1b[1mkept, plain");
    text += "\x1b\\\xff!";
    makeSafe(text, 10);
    EXPECT_EQ(text, "\x1b[1mkept, plain\\x1b\\\\\\xff!");
}

TEST(SafeText, ShowsControlCharactersAsTheirCodes) {
    EXPECT_EQ(safe("\x1b[2Jred"), "\\x1b[2Jred");
    EXPECT_EQ(safe("a\nb\tc\x7f"), "a\\x0ab\\x09c\\x7f");
    EXPECT_EQ(safe("\x9b\xc3\xa4"), "\\x9b\\xc3\\xa4");  // 9B begins a sequence on some terminals
    EXPECT_EQ(safe(std::string_view("\0z", 2)), "\\x00z");
}

TEST(SafeText, CannotBeTakenForAnEscape) { EXPECT_EQ(safe("\\x1b"), "\\\\x1b"); }

TEST(SafeText, LeavesPlainTextAsItIs) { EXPECT_EQ(safe("Teltone 2 ~!"), "Teltone 2 ~!"); }

TEST(TextForATerminal, KeepsLinesAndTabs) {
    std::string shown;
    appendForTerminal(shown, "one\n\ttwo \x1b]0;title\x07\n");
    EXPECT_EQ(shown, "one\n\ttwo \\x1b]0;title\\x07\n");
}

TEST(Xml, HasNoMarkupAndNothingThatIsNotAscii) {
    std::string text = "x";
    appendXml(text, "</b>&\"\x1b\xff\\");
    EXPECT_EQ(text, "x&lt;/b&gt;&amp;&quot;\\x1b\\xff\\\\");
    text.clear();
    appendEntities(text, "\\x1b <i>");
    EXPECT_EQ(text, "\\x1b &lt;i&gt;");
}

TEST(Padding, IsAddedAfterOrBeforeTheText) {
    std::string text = "ab";
    padTo(text, 1, 3);
    EXPECT_EQ(text, "ab  ");
    text = "ab";
    padTo(text, 1, 3, true);
    EXPECT_EQ(text, "a  b");
    text = "abcdef";
    padTo(text, 1, 3);
    EXPECT_EQ(text, "abcdef");
}

TEST(PlainName, IgnoresCaseBlanksHyphensAndUnderscores) {
    EXPECT_EQ(plainName("RELEASE COMPLETE"), "releasecomplete");
    EXPECT_EQ(plainName("release-complete"), plainName("Release_Complete"));
}

TEST(SplitAtCommas, LeavesOutEmptyWords) {
    EXPECT_EQ(splitAtCommas("a,,b,"), (std::vector<std::string>{"a", "b"}));
    EXPECT_TRUE(splitAtCommas("").empty());
}

TEST(ReadNumber, TakesTheWholeTextOrNothing) {
    unsigned number = 0;
    EXPECT_TRUE(readNumber(std::string_view("12"), number));
    EXPECT_EQ(number, 12U);
    for (const std::string_view wrong : {"", "12a", " 12", "-1", "99999999999"})
        EXPECT_FALSE(readNumber(wrong, number)) << wrong;
}

TEST(Hex, HasTwoSmallDigitsForEachOctet) {
    std::string text = "x";
    const std::uint8_t octets[] = {0x00, 0xAF, 0x5A};
    appendHex(text, octets);
    EXPECT_EQ(text, "x00af5a");
}

}  // namespace
}  // namespace reader
