#include "reader/browse/Canvas.h"

#include <gtest/gtest.h>

#include <clocale>

namespace reader::browse {
namespace {

class CanvasTest : public ::testing::Test {
  protected:
    CanvasTest() { std::setlocale(LC_CTYPE, "C.UTF-8"); }

    Canvas canvas_{10, 2};
};

TEST_F(CanvasTest, TextEndsAtTheBorder) {
    EXPECT_EQ(canvas_.put(7, 0, "abcdef"), 10);
    EXPECT_EQ(canvas_.line(0), "       abc");
    EXPECT_EQ(canvas_.line(1), "");
}

TEST_F(CanvasTest, TextOutsideItsBordersIsDropped) {
    EXPECT_EQ(canvas_.put(-2, 0, "abcd"), 2);
    EXPECT_EQ(canvas_.line(0), "cd");
    canvas_.put(0, 2, "below");
    canvas_.put(0, -1, "above");
    canvas_.fill({-5, -5, 100, 100}, {Ink::error});
    EXPECT_EQ(canvas_.line(0), "");
    EXPECT_EQ(canvas_.at(9, 1).style.ink, Ink::error);
}

TEST_F(CanvasTest, ControlCharactersAndWhatIsNoUtf8AreQuestionMarks) {
    canvas_.put(0, 0, "a\x1b[2J\x07\x9b\xff\x7f");
    EXPECT_EQ(canvas_.line(0), "a?[2J????");
}

TEST_F(CanvasTest, ControlCharactersOfUnicodeAreQuestionMarksAsWell) {
    canvas_.put(0, 0,
                "a\xc2\x9b"
                "b\xe2\x80\xae"
                "c");  // CSI in one character; right-to-left override
    EXPECT_EQ(canvas_.line(0).substr(0, 3), "a?b");
    EXPECT_EQ(canvas_.line(0).find("\xe2\x80\xae"), std::string::npos);
}

TEST_F(CanvasTest, WideCharactersTakeTwoColumns) {
    EXPECT_EQ(canvas_.put(0, 0, "漢字"), 4);
    EXPECT_TRUE(canvas_.at(1, 0).isSecondHalf);
    EXPECT_EQ(canvas_.line(0), "漢字");
    EXPECT_EQ(columnsOf("漢字─a"), 6);
}

TEST_F(CanvasTest, AWideCharacterThatDoesNotFitIsLeftOut) {
    EXPECT_EQ(canvas_.put(9, 0, "漢"), 9);
    EXPECT_EQ(canvas_.line(0), "");
}

TEST_F(CanvasTest, CharactersThatChangeTheOneBeforeThemAreLeftOut) {
    EXPECT_EQ(canvas_.put(0, 0, "e\xcc\x81x"), 2);
    EXPECT_EQ(canvas_.line(0), "ex");
}

TEST_F(CanvasTest, PaintChangesTheStyleAlone) {
    canvas_.put(0, 0, "abc");
    canvas_.paint({1, 0, 1, 1}, {Ink::ours, true, true});
    EXPECT_EQ(canvas_.line(0), "abc");
    EXPECT_EQ(canvas_.at(1, 0).style, (Style{Ink::ours, true, true}));
    EXPECT_EQ(canvas_.at(2, 0).style, Style());
}

}  // namespace
}  // namespace reader::browse
