// A line a frame.
#ifndef READER_LIST_H
#define READER_LIST_H

#include <memory>
#include <vector>

#include "reader/Columns.h"
#include "reader/Pipeline.h"

namespace CLI {
class App;
}

namespace reader {

// Composes lines of the columns that the options ask for.
class LineComposer : public Composer {
  public:
    // Throws UsageError for a column that there is none of.
    LineComposer(const ListOptions& options, bool colors);

    void compose(const Seen& seen, std::string& text, Piece& piece) override;

  private:
    std::vector<const Column*> columns_;
    bool relative_;
    bool colors_;
    TimeText times_;
};

int runList(const Options& options, Chatter& chatter);
void declareList(CLI::App& app, Options& options);

}  // namespace reader

#endif
