// Shows ladders as text, which can be pasted into a ticket.
#ifndef READER_LADDERTEXT_H
#define READER_LADDERTEXT_H

#include <cstddef>
#include <string>
#include <vector>

#include "reader/CallLadder.h"

namespace reader {

struct LadderTextForm {
    unsigned width = 80;  // columns of a line; less than `least` counts as `least`
    bool utf8 = false;    // arrows and life lines of UTF-8, else ASCII
    static constexpr unsigned leastWidth = 40;
    unsigned least = leastWidth;  // in the place of `leastWidth`; 38 at least
};

// Appends the headline, the names of both sides, and at least one line for each rung, without a line end
// after the last. Control characters are made harmless.
void appendLadder(std::string& to, const CallLadder& ladder, const LadderTextForm& form, TimeText& times);

// The same as lines without line ends, and which of them each rung begins.
struct LadderLines {
    std::vector<std::string> lines;
    std::vector<std::size_t> rungs;
};
LadderLines ladderLines(const CallLadder& ladder, const LadderTextForm& form, TimeText& times);

// Puts items, with two blanks between them, into lines of at most `width` characters. Lines are broken at
// blanks where possible.
std::vector<std::string> wrapped(const std::vector<std::string>& items, std::size_t width);

}  // namespace reader

#endif
