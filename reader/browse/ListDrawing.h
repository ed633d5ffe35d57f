// Draws the parts that all lists have.
#ifndef READER_BROWSE_LISTDRAWING_H
#define READER_BROWSE_LISTDRAWING_H

#include <string>
#include <string_view>
#include <vector>

#include "calls/Finding.h"
#include "reader/browse/Canvas.h"

namespace reader::browse {

// The first columns of each line of a list: ">" where the cursor is, "*" for what is marked.
inline constexpr int gutter = 2;
void drawGutter(Canvas& canvas, const Area& area, int line, bool isCurrent, bool isMarked);

// Draws a rule and up to `most` lines of text below it at the foot of an area, where `most` lines are always
// taken. Returns the area above. If fewer than `least` lines would be left there, draws nothing and returns
// the whole area.
Area drawDetails(Canvas& canvas, const Area& area, const std::vector<std::string>& lines, int most, int least,
                 bool utf8);

Ink inkOf(calls::Severity severity);

}  // namespace reader::browse

#endif
