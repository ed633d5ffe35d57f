// lapdread list: shows each frame in a line.
#ifndef READER_LIST_H
#define READER_LIST_H

#include <memory>
#include <vector>

#include "reader/Columns.h"
#include "reader/OptionRow.h"
#include "reader/Pipeline.h"

namespace reader {

// Composes lines of the columns that the options ask for.
class LineComposer : public Composer {
  public:
    // Throws UsageError if a column does not exist.
    LineComposer(const ListOptions& options, bool colors);

    void compose(const Seen& seen, std::string& text, Piece& piece) override;

  private:
    std::vector<Column> columns_;
    std::size_t delta_;  // place of the delta column among them; their number if it is none of them
    bool relative_;
    bool colors_;
    TimeText times_;
};

int runList(const Options& options, Chatter& chatter);
std::span<const OptionRow> listOptions();

}  // namespace reader

#endif
