// A screen as a table of characters. Screens draw on it; a terminal, or a test, shows it.
#ifndef READER_BROWSE_CANVAS_H
#define READER_BROWSE_CANVAS_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace reader::browse {

// What a character is about. A terminal without colours shows them alike: whatever matters is also told by
// words or signs.
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

// Nothing that is put can be a control character, and nothing stands outside.
class Canvas {
  public:
    Canvas(int width, int height);

    int width() const { return width_; }
    int height() const { return height_; }
    Area whole() const { return {0, 0, width_, height_}; }
    const Cell& at(int x, int y) const { return cells_[index(x, y)]; }

    // Puts UTF-8 text from a column on, in columns before `end` only. Returns the column behind it. What
    // cannot be printed is shown as "?".
    int put(int x, int y, std::string_view text, Style style, int end);
    int put(int x, int y, std::string_view text, Style style = {}) { return put(x, y, text, style, width_); }
    // Blanks in `style`.
    void fill(const Area& area, Style style = {});
    // What stands there already takes this style.
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
