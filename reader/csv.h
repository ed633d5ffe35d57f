// One row a frame, for spreadsheets (RFC 4180, but with line feeds alone).
#ifndef READER_CSV_H
#define READER_CSV_H

#include <string_view>

#include "reader/Pipeline.h"

namespace reader {

// The first line, with its line end.
std::string_view csvHeader();

// Only frames have rows; numbers are decimal, "callref" and "hex" hexadecimal.
class CsvComposer : public Composer {
  public:
    void compose(const Seen& seen, std::string& text, Piece& piece) override;

  private:
    TimeText times_;
};

}  // namespace reader

#endif
