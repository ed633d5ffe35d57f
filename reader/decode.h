// lapdread decode: writes frames as lapdmon's log has them.
#ifndef READER_DECODE_H
#define READER_DECODE_H

#include "decoder/time_lines.h"
#include "reader/Pipeline.h"

namespace reader {

// Composes the text that lapdmon writes for an item, with the same code: a frame's block, or the line about a
// loss. Other items give no text. An object must be used by one thread only, because the decoder's variables
// belong to the thread.
class LogTextComposer : public Composer {
  public:
    void compose(const Seen& seen, std::string& text, Piece& piece) override;

  private:
    decoder::LocalTime localTime_;
};

int runDecode(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
