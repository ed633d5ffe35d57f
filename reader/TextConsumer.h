// Writes composed text, with the time between lines filled in.
#ifndef READER_TEXT_CONSUMER_H
#define READER_TEXT_CONSUMER_H

#include "reader/Output.h"
#include "reader/Pipeline.h"

namespace reader {

class TextConsumer : public Consumer {
  public:
    enum class Raw { no, yes };

    // Text that holds octets of frames as they are is raw: a terminal gets them in a readable form.
    explicit TextConsumer(Output& out, Raw raw = Raw::no)
        : out_(out), harmless_(raw == Raw::yes && out.isTerminal()) {}

    void take(Chunk& chunk, std::size_t count) override;
    void flush() override { out_.flush(); }

  private:
    void fillInTimes(Chunk& chunk, std::size_t count);
    static void widen(Chunk& chunk, std::size_t first, std::size_t more);

    Output& out_;
    bool harmless_;
    Instant before_;  // of the last piece that has a time
};

}  // namespace reader

#endif
