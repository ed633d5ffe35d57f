#include "reader/browse/ListDrawing.h"

#include <algorithm>

namespace reader::browse {

void drawGutter(Canvas& canvas, const Area& area, int line, bool isCurrent, bool isMarked) {
    const int y = area.y + line;
    canvas.put(area.x, y, isCurrent ? ">" : " ", {Ink::plain, true, false});
    canvas.put(area.x + 1, y, isMarked ? "*" : " ", {Ink::warning, true, false});
}

Area drawDetails(Canvas& canvas, const Area& area, const std::vector<std::string>& lines, int most, int least,
                 bool utf8) {
    const int count = most;
    if (area.height < count + 1 + least)
        return area;
    const int top = area.y + area.height - count - 1;
    std::string rule;
    for (int i = 0; i < area.width; ++i)
        rule += utf8 ? "─" : "-";
    canvas.put(area.x, top, rule, {Ink::faint});
    for (int i = 0; i < count && i < static_cast<int>(lines.size()); ++i)
        canvas.put(area.x, top + 1 + i, lines[static_cast<std::size_t>(i)]);
    return {area.x, area.y, area.width, area.height - count - 1};
}

Ink inkOf(calls::Severity severity) {
    switch (severity) {
        case calls::Severity::error:
            return Ink::error;
        case calls::Severity::warning:
            return Ink::warning;
        case calls::Severity::note:
            break;
    }
    return Ink::note;
}

}  // namespace reader::browse
