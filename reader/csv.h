// Writes a row for each frame, for spreadsheets (RFC 4180, but lines end with a line feed only).
#ifndef READER_CSV_H
#define READER_CSV_H

#include <string>
#include <string_view>

#include "reader/Pipeline.h"

namespace reader {

// The first line, with its line end.
std::string_view csvHeader();

// Appends a value, quoted if necessary. Values that a spreadsheet would take for a formula are not changed,
// because numbers like "+49" are data.
void appendCsvValue(std::string& to, std::string_view value);

// Composes the row of a frame; other items have none. Numbers are decimal, "callref" and "hex" hexadecimal.
class CsvComposer : public Composer {
  public:
    void compose(const Seen& seen, std::string& text, Piece& piece) override;

  private:
    TimeText times_;
};

}  // namespace reader

#endif
