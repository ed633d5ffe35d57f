#include "reader/browse/HelpScreen.h"

#include <algorithm>

#include "reader/LadderText.h"

namespace reader::browse {

namespace {

constexpr std::size_t keyWidth = 14;

void appendKeys(std::vector<std::string>& lines, std::span<const KeyHint> keys, int width) {
    const auto room = static_cast<std::size_t>(std::max(width, 30)) - keyWidth;
    for (const KeyHint& hint : keys) {
        std::string key = "  " + std::string(hint.key);
        for (const std::string& line : wrapped({std::string(hint.help)}, room)) {
            key.resize(keyWidth, ' ');
            lines.push_back(key + line);
            key.clear();
        }
    }
}

}  // namespace

void HelpScreen::draw(Canvas& canvas, const Area& area) {
    std::vector<std::string> lines;
    if (!ofScreen_.empty())
        lines.emplace_back("On this screen");
    appendKeys(lines, ofScreen_, area.width);
    lines.emplace_back(ofScreen_.empty() ? "Keys" : "Everywhere");
    appendKeys(lines, everywhere_, area.width);
    // The cursor moves the text: it stands on the first line that is shown as long as there is more below.
    const auto height = static_cast<std::size_t>(std::max(area.height, 1));
    cursor_.fit(lines.size() > height ? lines.size() - height + 1 : 1, 1);
    for (std::size_t i = 0; i < height && cursor_.line() + i < lines.size(); ++i) {
        const std::string& line = lines[cursor_.line() + i];
        const bool isHeading = line[0] != ' ';
        canvas.put(area.x, area.y + static_cast<int>(i), line,
                   {isHeading ? Ink::title : Ink::plain, isHeading});
    }
}

}  // namespace reader::browse
