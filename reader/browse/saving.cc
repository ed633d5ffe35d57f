#include "reader/browse/saving.h"

#include <memory>

#include "reader/Redacting.h"
#include "reader/forms.h"
#include "reader/inputs.h"
#include "reader/outputs.h"

namespace reader::browse {

namespace {

constexpr std::size_t itemsInChunk = 256;

// Counts the frames and hands them on to the consumer that writes them.
class Counting : public Consumer {
  public:
    explicit Counting(Consumer& next) : next_(next) {}

    void take(Chunk& chunk, std::size_t count) override {
        count_ += count;
        next_.take(chunk, count);
    }
    void flush() override { next_.flush(); }
    std::uint64_t count() const { return count_; }

  private:
    Consumer& next_;
    std::uint64_t count_ = 0;
};

void handOn(Chunk& chunk, Consumer& to) {
    chunk.seal();
    // Read the headers now, because the chunk holds copies of the octets and headers are views of them.
    for (Seen& seen : chunk.seen())
        readHeaders(seen);
    to.take(chunk, chunk.pieces.size());
    chunk.clear();
}

// Hands over all items up to the last frame of the order; those of the order pass.
void run(const FrameStore& frames, const SaveOrder& order, bool wantsAll, Consumer& to) {
    Chunk chunk;
    Shown shown;
    const std::uint64_t last = *order.frames.rbegin();
    for (std::uint64_t place = frames.begin(); place < frames.end() && frames.load(place, shown); ++place) {
        const Seen& seen = shown.seen();
        if (seen.number > last)
            break;
        const bool isWanted = seen.number != 0 && order.frames.contains(seen.number);
        if (!isWanted && !wantsAll)
            continue;
        if (isWanted)
            chunk.pieces.emplace_back().item = chunk.size();
        chunk.add(seen);
        if (chunk.size() >= itemsInChunk)
            handOn(chunk, to);
    }
    handOn(chunk, to);
}

}  // namespace

std::string saveFrames(const FrameStore& frames, const SaveOrder& order, const Options& options,
                       const redaction::Key& key) {
    const Form& form = formNamed("pcapng");
    const std::string path = order.path;
    checkOutput(path, inputFiles(options), form.what, form.looksRight);
    Chatter quiet(Loudness::quiet);
    Output out(path);
    const auto writer = form.makeWriter(out.descriptor(), out.name());
    WriterConsumer writing(*writer, form, quiet);
    Counting counting(writing);
    if (order.redacted) {
        Options own = options;
        own.filters.clear();
        Redacting redacting(own, key, redaction::Direction::redact, nullptr, counting);
        run(frames, order, true, redacting);
        redacting.finish();
    } else {
        run(frames, order, false, counting);
    }
    writing.finish();
    return "wrote " + std::to_string(counting.count()) + (counting.count() == 1 ? " frame" : " frames") +
           (order.redacted ? ", redacted, to " : " to ") + path;
}

}  // namespace reader::browse
