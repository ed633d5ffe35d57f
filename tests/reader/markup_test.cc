#include "reader/report/markup.h"

#include <gtest/gtest.h>

namespace reader {

namespace {

FigureTable table() {
    return {"name",
            "What <it> shows",
            {{"said_by", "", FigureColumn::Kind::key}, {"n", "count"}},
            {{"</script>", "3"}, {"b", ""}}};
}

TEST(Markup, OfATableHasItsCaptionHeadingsAndTextAlone) {
    std::string markup;
    appendTable(markup, table());
    EXPECT_EQ(
        markup,
        "<div class=\"scroll\"><table>\n<caption>What &lt;it&gt; shows</caption>\n"
        "<thead><tr><th scope=\"col\">said by</th><th scope=\"col\" class=\"n\">count</th></tr></thead>\n"
        "<tbody>\n"
        "<tr><th scope=\"row\">&lt;/script&gt;</th><td class=\"n\">3</td></tr>\n"
        "<tr><th scope=\"row\">b</th><td class=\"n\"></td></tr>\n"
        "</tbody></table></div>\n");
}

TEST(Markup, OfATableWithoutRowsIsNothing) {
    FigureTable empty = table();
    empty.rows.clear();
    std::string markup;
    appendTable(markup, empty);
    EXPECT_EQ(markup, "");
}

TEST(Json, OfTablesIsAnObjectWithAnArrayEach) {
    FigureTable empty = table();
    empty.rows.clear();
    empty.name = "empty";
    EXPECT_EQ(jsonOf({table(), empty}),
              "{\n\"name\":[\n{\"v\":1,\"table\":\"name\",\"said_by\":\"</script>\",\"n\":3},\n"
              "{\"v\":1,\"table\":\"name\",\"said_by\":\"b\",\"n\":null}],\n\"empty\":[\n]}");
}

TEST(Pieces, CountsThePiecesForWhichThereIsNoRoom) {
    Pieces pieces(2);
    for (const char* const piece : {"a", "b", "c"})
        pieces.add(piece);
    pieces.leaveOut();
    EXPECT_EQ(pieces.text(), "ab");
    EXPECT_EQ(pieces.count(), 2U);
    EXPECT_EQ(pieces.leftOut(), 2U);
}

TEST(Pieces, EndsWithTheOneThatTakesTheLastRoom) {
    Pieces pieces(100, 4);
    for (const char* const piece : {"abc", "defg", "h"})
        pieces.add(piece);
    EXPECT_EQ(pieces.text(), "abcdefg");
    EXPECT_EQ(pieces.leftOut(), 1U);
}

}  // namespace

}  // namespace reader
