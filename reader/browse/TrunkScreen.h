// The state of each D channel: its links, its channels as a row of cells, how busy it is, the last findings.
#ifndef READER_BROWSE_TRUNKSCREEN_H
#define READER_BROWSE_TRUNKSCREEN_H

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "reader/browse/Cursor.h"
#include "reader/browse/Screen.h"

namespace reader::browse {

class TrunkScreen : public Screen {
  public:
    explicit TrunkScreen(Desk& desk) : Screen(desk) {}

    std::string title() const override;
    void draw(Canvas& canvas, const Area& area) override;
    bool press(const Key& key) override;
    std::span<const KeyHint> keys() const override;

  private:
    struct Piece {
        std::string text;
        Style style;
    };
    struct Line {
        std::vector<Piece> pieces;
        std::optional<std::uint64_t> frame{};  // the frame that Enter opens
    };

    void build(int width);
    void putTrunk(const TrunkView& trunk, int width);
    void putCells(const calls::CellRow& row, int width);
    void putLegend(int width);
    void putFindings(int width);
    void putLine(std::string text, Style style = {}) { lines_.push_back({{{std::move(text), style}}}); }

    std::vector<Line> lines_;
    unsigned usesShown_ = 0;  // a bit for each kind of cell that is shown, so that the legend explains it
    Cursor cursor_;
    int top_ = 0;
};

}  // namespace reader::browse

#endif
