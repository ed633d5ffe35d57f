#include "reader/browse/Canvas.h"

#include <algorithm>
#include <cwchar>

namespace reader::browse {

namespace {

constexpr char32_t unreadable = U'?';

// Removes the first character from the text and returns it; `unreadable` if it is not valid UTF-8.
char32_t takeCharacter(std::string_view& text) {
    const auto first = static_cast<unsigned char>(text[0]);
    const std::size_t length = first < 0x80    ? 1
                               : first >= 0xF0 ? 4
                               : first >= 0xE0 ? 3
                               : first >= 0xC0 ? 2
                                               : 0;
    if (length == 0 || length > text.size()) {
        text.remove_prefix(1);
        return unreadable;
    }
    char32_t character = length == 1 ? first : first & (0xFFU >> (length + 1));
    for (std::size_t i = 1; i < length; ++i) {
        const auto octet = static_cast<unsigned char>(text[i]);
        if ((octet & 0xC0U) != 0x80) {
            text.remove_prefix(1);
            return unreadable;
        }
        character = character << 6 | (octet & 0x3FU);
    }
    text.remove_prefix(length);
    return character;
}

int widthOf(char32_t character) {
    if (character >= U' ' && character <= U'~')
        return 1;
    return wcwidth(static_cast<wchar_t>(character));
}

}  // namespace

void appendUtf8(std::string& to, char32_t character) {
    const auto put = [&](char32_t octet) { to += static_cast<char>(octet); };
    if (character < 0x80) {
        put(character);
    } else if (character < 0x800) {
        put(0xC0 | character >> 6);
        put(0x80 | (character & 0x3F));
    } else if (character < 0x10000) {
        put(0xE0 | character >> 12);
        put(0x80 | (character >> 6 & 0x3F));
        put(0x80 | (character & 0x3F));
    } else {
        put(0xF0 | character >> 18);
        put(0x80 | (character >> 12 & 0x3F));
        put(0x80 | (character >> 6 & 0x3F));
        put(0x80 | (character & 0x3F));
    }
}

int columnsOf(std::string_view text) {
    int columns = 0;
    while (!text.empty())
        columns += std::max(widthOf(takeCharacter(text)), 1);
    return columns;
}

Canvas::Canvas(int width, int height)
    : width_(std::max(width, 1)),
      height_(std::max(height, 1)),
      cells_(static_cast<std::size_t>(width_) * static_cast<std::size_t>(height_)) {}

int Canvas::put(int x, int y, std::string_view text, Style style, int end) {
    end = std::min(end, width_);
    if (y < 0 || y >= height_)
        return x;
    while (!text.empty()) {
        char32_t character = takeCharacter(text);
        int columns = widthOf(character);
        if (columns == 0)
            continue;  // a combining character would change the one before it
        if (columns < 0) {
            character = unreadable;
            columns = 1;
        }
        if (x + columns > end)
            return x;
        if (x >= 0) {
            cell(x, y) = {character, style, false};
            if (columns == 2)
                cell(x + 1, y) = {U' ', style, true};
        }
        x += columns;
    }
    return x;
}

void Canvas::fill(const Area& area, Style style) {
    for (int y = std::max(area.y, 0); y < std::min(area.y + area.height, height_); ++y) {
        for (int x = std::max(area.x, 0); x < std::min(area.x + area.width, width_); ++x)
            cell(x, y) = {U' ', style, false};
    }
}

void Canvas::paint(const Area& area, Style style) {
    for (int y = std::max(area.y, 0); y < std::min(area.y + area.height, height_); ++y) {
        for (int x = std::max(area.x, 0); x < std::min(area.x + area.width, width_); ++x)
            cell(x, y).style = style;
    }
}

std::string Canvas::line(int y) const {
    std::string text;
    for (int x = 0; x < width_; ++x) {
        if (!at(x, y).isSecondHalf)
            appendUtf8(text, at(x, y).character);
    }
    text.erase(text.find_last_not_of(' ') + 1);
    return text;
}

}  // namespace reader::browse
