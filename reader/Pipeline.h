// Moves items from an input to a command's output: reads them in order, lets several threads work on them,
// and hands them on in the same order.
#ifndef READER_PIPELINE_H
#define READER_PIPELINE_H

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>

#include "capture/Reader.h"
#include "reader/CallGate.h"
#include "reader/Chatter.h"
#include "reader/Chunk.h"
#include "reader/Filter.h"
#include "reader/Tracker.h"

namespace reader {

// Makes the text that a command shows for an item. Each thread has its own object.
class Composer {
  public:
    virtual ~Composer() = default;
    // Appends the text of an item that passed the filters. May set in `piece` where the time since the piece
    // before is to be written.
    virtual void compose(const Seen& seen, std::string& text, Piece& piece) = 0;
};

// Takes the chunks at the end of the pipeline, in the order of the input. One thread at a time calls it, and
// not always the same one.
class Consumer {
  public:
    virtual ~Consumer() = default;
    // Takes a chunk. Only the first `count` of its pieces are wanted.
    virtual void take(Chunk& chunk, std::size_t count) = 0;
    // Whether take() is also called for chunks in which nothing has passed the filters.
    virtual bool wantsAll() const { return false; }
    // Whether --first limits something other than frames. The consumer then does the counting itself.
    virtual bool countsItself() const { return false; }
    // So much time has passed on the host's clock, and nothing has come.
    virtual void advance(std::int64_t /*nanoseconds*/) {}
    // Writes out everything that was taken. Called when the input has nothing more just now, and at its end.
    virtual void flush() = 0;
};

struct Work {
    std::function<std::unique_ptr<Composer>()> makeComposer;  // called on the thread of runPipeline
    std::uint64_t first = 0;                                  // the most pieces that are handed on; 0: all
    std::uint64_t skipped = 0;                                // how many are left out in front of them
    unsigned jobs = 1;                                        // how many threads work, the caller's included
    bool eachAtOnce = false;   // each item is handed on before the next is read
    CallGate* gate = nullptr;  // lets through only frames of the calls that are wanted; null: all frames
    bool clockRuns = false;    // whether the consumer is told that time passes while nothing comes
    // a signal sets it; the work then ends with what has been read
    const std::atomic<bool>* stopped = nullptr;
};

struct Outcome {
    bool isWhole = false;      // the input was read to its end, and the consumer got all that passed
    std::uint64_t passed = 0;  // how many items passed the filters
};

// Returns once the input has ended, `first` pieces are handed on, or a signal came. Throws what the reader,
// the composers and the consumer throw.
Outcome runPipeline(capture::Reader& reader, Tracker& tracker, Filter& filter, Consumer& consumer,
                    Chatter& chatter, const Work& work);

}  // namespace reader

#endif
