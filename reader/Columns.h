// The columns of the line with which `list` shows a frame.
#ifndef READER_COLUMNS_H
#define READER_COLUMNS_H

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "reader/Seen.h"
#include "reader/TimeText.h"

namespace reader {

// What a column gets to write its text.
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
    // shorter texts are filled up with blanks; 0 for the last columns, which are not filled up
    unsigned width;
    bool right;  // blanks go before the text, not after it
    void (*put)(Cell& cell);
};

// No column is wider. What follows a text is cut from as many blanks, and one more.
inline constexpr unsigned widestColumn = 31;

// In the order in which they stand in the widest line.
std::span<const Column> columns();

// Throws UsageError if there is no column of this name.
const Column& columnNamed(std::string_view name);

// The column for the time since the line before. Its text is known only when the lines are in order.
inline constexpr std::string_view deltaColumn = "delta";
inline constexpr std::size_t deltaWidth = 10;

// Appends the words that replace the message if the item is no frame: "frames lost: 17".
void appendEvent(std::string& to, const capture::Item& item);

// Appends the message's name, "SETUP". Without a message, appends the name of the frame or event.
void appendMessageName(std::string& to, const isdn::Layer3& message);
void appendMessageName(std::string& to, const Seen& seen);

// Appends what matters in a frame's contents, in words. Appends nothing for an empty frame.
void appendDetails(std::string& to, const Seen& seen);

// Appends "0378o": the call reference in hexadecimal, and whether the message comes from the call's
// originator (o) or goes to it (d).
void appendCallReference(std::string& to, const Seen& seen);

}  // namespace reader

#endif
