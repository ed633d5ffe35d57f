// The columns of a line that shows a frame.
#ifndef READER_COLUMNS_H
#define READER_COLUMNS_H

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "reader/Seen.h"
#include "reader/TimeText.h"

namespace reader {

// What a column's text is made of.
struct Cell {
    const Seen& seen;
    std::string& line;
    TimeText& times;
    bool relative;  // times are seconds since the first frame
    bool colors;
};

struct Column {
    std::string_view name;
    std::string_view help;
    unsigned width;  // shorter texts are filled up with blanks; 0 for the last columns, which are as long as
                     // they are
    bool right;      // the blanks stand in front
    void (*put)(Cell& cell);
};

// In the order in which they stand in the widest line.
std::span<const Column> columns();

// Throws UsageError for a name that is none.
const Column& columnNamed(std::string_view name);

// The column whose text is known only when the lines are put in order: the time since the line before.
inline constexpr std::string_view deltaColumn = "delta";
inline constexpr std::size_t deltaWidth = 10;

// What stands in the place of a message for an item that is no frame: "frames lost: 17".
void appendEvent(std::string& to, const capture::Item& item);

// The message's name, "SETUP"; what there is to say where there is none.
void appendMessageName(std::string& to, const isdn::Layer3& message);
void appendMessageName(std::string& to, const Seen& seen);

// What matters of a frame's contents, in words; nothing of an empty frame.
void appendDetails(std::string& to, const Seen& seen);

// "0378o": the call reference in hexadecimal, and whether the message comes from the originator or goes to
// it.
void appendCallReference(std::string& to, const Seen& seen);

}  // namespace reader

#endif
