// Ladders as text, which can be pasted into a ticket.
#ifndef READER_LADDERTEXT_H
#define READER_LADDERTEXT_H

#include <string>

#include "reader/CallLadder.h"

namespace reader {

struct LadderTextForm {
    unsigned width = 80;  // columns of a line; below `leastWidth` lines are that long all the same
    bool utf8 = false;    // arrows and life lines of UTF-8, else ASCII
    static constexpr unsigned leastWidth = 40;
};

// The headline, the names of both sides, and a line or more for each rung; no line end behind the last one.
// Nothing in it commands a terminal.
void appendLadder(std::string& to, const CallLadder& ladder, const LadderTextForm& form, TimeText& times);

// Lines of `width` characters at most, broken at blanks where there are any. Items stand two blanks apart.
std::vector<std::string> wrapped(const std::vector<std::string>& items, std::size_t width);

}  // namespace reader

#endif
