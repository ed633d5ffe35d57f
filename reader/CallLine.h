// Shows a call in one line.
#ifndef READER_CALLLINE_H
#define READER_CALLLINE_H

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "calls/Call.h"
#include "reader/TimeText.h"

namespace reader {

// A column of the line: its heading, its width, and the function that fills it in.
struct CallLineColumn {
    std::string_view heading;
    std::string_view before;  // the word that names the value in a headline, which has no headings
    unsigned width;           // 0: as long as the text is
    bool right;               // blanks that fill it up stand in front
    // Appends its text, which commands no terminal.
    void (*put)(std::string& to, const calls::Call& call, TimeText& times);
    bool forSeveral = false;  // only a line that tells D channels apart has it
};
std::span<const CallLineColumn> callLineColumns();

// The heading above the lines.
std::string callHeading(bool severalDChannels = false);
// Appends the line of a call, without line end.
void appendCallLine(std::string& to, const calls::Call& call, TimeText& times, bool severalDChannels = false);
// The same as the cells of a table. Control characters are made harmless. An empty cell means that there is
// no value.
struct CallColumn {
    std::string_view heading;
    bool isNumber = false;
};
std::vector<CallColumn> callColumns();
std::vector<std::string> callCells(const calls::Call& call, TimeText& times);
// The same for a headline: the fields that have a value, each with a word that names it ("duration 3.100").
// Control characters are made harmless.
std::vector<std::string> callWords(const calls::Call& call, TimeText& times, bool severalDChannels = false);

}  // namespace reader

#endif
