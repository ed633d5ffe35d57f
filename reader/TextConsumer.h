// Writes composed text, and fills in the time between lines.
#ifndef READER_TEXT_CONSUMER_H
#define READER_TEXT_CONSUMER_H

#include "reader/Output.h"
#include "reader/Pipeline.h"

namespace reader {

class TextConsumer : public Consumer {
  public:
    enum class Raw { no, yes };

    // `raw`: the text contains octets of frames as they are. They are written in a readable form if the
    // output is a terminal.
    explicit TextConsumer(Output& out, Raw raw = Raw::no)
        : out_(out), harmless_(raw == Raw::yes && out.isTerminal()) {}

    void take(Chunk& chunk, std::size_t count) override;
    void flush() override { out_.flush(); }

  private:
    void fillInTimes(Chunk& chunk, std::size_t count);
    static void widen(Chunk& chunk, std::size_t first, std::size_t more);

    Output& out_;
    bool harmless_;
    Instant before_;  // the time of the last piece that has one
};

}  // namespace reader

#endif
