// Composes HTML. Text in it is escaped, so that it is never taken for markup.
#ifndef READER_REPORT_MARKUP_H
#define READER_REPORT_MARKUP_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "reader/figureTables.h"

namespace reader {

struct HtmlColumn {
    std::string_view heading;
    bool isNumber = false;
};
// "<thead>...": the headings of a table.
void appendHead(std::string& to, const std::vector<HtmlColumn>& columns);

// A table of figures with its caption; nothing without rows.
void appendTable(std::string& to, const FigureTable& table);

// The tables as JSON that may be put into <script type="application/json">: {"messages":[{...},...],...}.
std::string jsonOf(const std::vector<FigureTable>& tables);

// Collects pieces of HTML up to a limit.
class Pieces {
  public:
    explicit Pieces(std::uint64_t most, std::size_t mostOctets = std::string::npos)
        : most_(most), mostOctets_(mostOctets) {}

    bool hasRoom() const { return count_ < most_ && text_.size() < mostOctets_; }
    // Adds the piece, or counts it if there is no room.
    void add(std::string_view piece);
    // Counts a piece that was not made, because there is no room.
    void leaveOut() { ++leftOut_; }

    const std::string& text() const { return text_; }
    std::uint64_t count() const { return count_; }
    std::uint64_t leftOut() const { return leftOut_; }

  private:
    std::uint64_t most_;
    std::size_t mostOctets_;
    std::string text_;
    std::uint64_t count_ = 0;
    std::uint64_t leftOut_ = 0;
};

}  // namespace reader

#endif
