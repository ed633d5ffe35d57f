// A screen as a table of characters. Screens draw on it; a terminal, or a test, shows it.
#ifndef READER_BROWSE_CANVAS_H
#define READER_BROWSE_CANVAS_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace reader::browse {

// The meaning of a character, shown by its colour. A terminal without colours shows all of them alike, so
// words or signs must say the same.
enum class Ink : std::uint8_t { plain, ours, theirs, error, warning, note, title, faint };

struct Style {
    Ink ink = Ink::plain;
    bool bold = false;
    bool reverse = false;
    bool operator==(const Style&) const = default;
};

struct Cell {
    char32_t character = U' ';
    Style style{};
    bool isSecondHalf = false;  // of the wide character in front of it
    bool operator==(const Cell&) const = default;
};

struct Area {
    int x = 0, y = 0, width = 0, height = 0;
};

// Holds no control characters. Whatever is put outside is cut off.
class Canvas {
  public:
    Canvas(int width, int height);

    int width() const { return width_; }
    int height() const { return height_; }
    Area whole() const { return {0, 0, width_, height_}; }
    const Cell& at(int x, int y) const { return cells_[index(x, y)]; }

    // Puts UTF-8 text from column `x` on, as far as it fits before column `end`. Returns the column after the
    // text. A character that cannot be printed is shown as "?".
    int put(int x, int y, std::string_view text, Style style, int end);
    int put(int x, int y, std::string_view text, Style style = {}) { return put(x, y, text, style, width_); }
    // Fills the area with blanks of this style.
    void fill(const Area& area, Style style = {});
    // Gives this style to the characters that are in the area.
    void paint(const Area& area, Style style);

    // A line as UTF-8, without the blanks at its end.
    std::string line(int y) const;

  private:
    std::size_t index(int x, int y) const {
        return static_cast<std::size_t>(y) * static_cast<std::size_t>(width_) + static_cast<std::size_t>(x);
    }
    Cell& cell(int x, int y) { return cells_[index(x, y)]; }

    int width_;
    int height_;
    std::vector<Cell> cells_;
};

// How many columns UTF-8 text takes.
int columnsOf(std::string_view text);

void appendUtf8(std::string& to, char32_t character);

}  // namespace reader::browse

#endif
