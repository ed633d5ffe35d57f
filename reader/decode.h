// Frames in the words of lapdmon's log.
#ifndef READER_DECODE_H
#define READER_DECODE_H

#include "decoder/time_lines.h"
#include "reader/Pipeline.h"

namespace reader {

// Composes the text that lapdmon writes for an item, by the same code: a frame's block, or the line that
// stands for a loss. Other items give no text. One object is used by one thread, and none by two: the
// decoder's words are the thread's own.
class LogTextComposer : public Composer {
  public:
    void compose(const Seen& seen, std::string& text, Piece& piece) override;

  private:
    decoder::LocalTime localTime_;
};

int runDecode(const Options& options, Chatter& chatter);

}  // namespace reader

#endif
