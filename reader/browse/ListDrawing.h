// Pieces that lists are drawn with.
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

// Lines of text at the foot of an area, below a rule; returns what is left above. Nothing is drawn where the
// area has not got `least` lines besides.
Area drawDetails(Canvas& canvas, const Area& area, const std::vector<std::string>& lines, int most, int least,
                 bool utf8);

Ink inkOf(calls::Severity severity);

}  // namespace reader::browse

#endif
