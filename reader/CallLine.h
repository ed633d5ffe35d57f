// A call in one line, for people.
#ifndef READER_CALLLINE_H
#define READER_CALLLINE_H

#include <string>
#include <string_view>
#include <vector>

#include "calls/Call.h"
#include "reader/TimeText.h"

namespace reader {

// What stands above the lines.
std::string callHeading();
// The line, without its line end.
void appendCallLine(std::string& to, const calls::Call& call, TimeText& times);
// The same as cells of a table. Nothing in them commands a terminal; an empty one has no value.
struct CallColumn {
    std::string_view heading;
    bool isNumber = false;
};
std::vector<CallColumn> callColumns();
std::vector<std::string> callCells(const calls::Call& call, TimeText& times);
// The same for a headline: what there is to say, each with the word that tells what it is ("duration 3.100").
// Nothing in it commands a terminal.
std::vector<std::string> callWords(const calls::Call& call, TimeText& times);

}  // namespace reader

#endif
