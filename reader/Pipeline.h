// From an input to a command's output: items are read in order, worked on by several threads, and handed on
// in order.
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

// Makes a command's text of items. Each thread has one of its own.
class Composer {
  public:
    virtual ~Composer() = default;
    // Appends the text of an item that passed the filters. The piece may tell where the place for the time
    // since the last one is.
    virtual void compose(const Seen& seen, std::string& text, Piece& piece) = 0;
};

// Where chunks go. Called on the thread of runPipeline, in the order of the input.
class Consumer {
  public:
    virtual ~Consumer() = default;
    // Of the chunk's pieces the first `count` are wanted.
    virtual void take(Chunk& chunk, std::size_t count) = 0;
    // Whether chunks are handed over in which nothing has passed the filters.
    virtual bool wantsAll() const { return false; }
    // Whether the number of results that the user has asked for is one of other things than frames, which the
    // consumer counts.
    virtual bool countsItself() const { return false; }
    // The host's clock says that so much time has passed, and nothing has come.
    virtual void advance(std::int64_t /*nanoseconds*/) {}
    // Nothing more is there just now, or the input has ended: what was taken goes out.
    virtual void flush() = 0;
};

struct Work {
    std::function<std::unique_ptr<Composer>()> makeComposer;  // called on the thread of runPipeline
    std::uint64_t first = 0;   // so many pieces and no more; 0: all. A consumer may count itself
    unsigned jobs = 1;         // threads, the caller's among them
    bool eachAtOnce = false;   // each item is handed on before the next is read
    CallGate* gate = nullptr;  // lets through frames of the calls that are wanted; null: all
    bool clockRuns = false;    // time passes while nothing comes
    const std::atomic<bool>* stopped = nullptr;  // set by a signal: the work ends with what was read
};

struct Outcome {
    bool isWhole = false;      // the input was read to its end, and the consumer has got all that passed
    std::uint64_t passed = 0;  // items that passed the filters
};

// Returns once the input has ended, `first` pieces are out, or a signal came. What reading, composing and
// consuming throw comes out of here.
Outcome runPipeline(capture::Reader& reader, Tracker& tracker, Filter& filter, Consumer& consumer,
                    Chatter& chatter, const Work& work);

}  // namespace reader

#endif
