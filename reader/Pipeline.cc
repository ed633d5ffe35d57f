#include "reader/Pipeline.h"

#include <algorithm>
#include <chrono>
#include <utility>
#include <vector>

#include "reader/Crew.h"
#include "reader/Polls.h"

namespace reader {

namespace {

// Large enough that handing chunks over costs little, small enough that a few of them fit into the cache.
constexpr std::size_t itemsInChunk = 256;
constexpr std::size_t chunksForEachThread = 3;
constexpr std::chrono::milliseconds longestWait{500};
// How much later than a frame passed a recorder may write it. Time on this host's clock counts only after
// that.
constexpr std::chrono::seconds recorderMayLag{2};

// Where links are left alone nobody asks for headers either.
void composeChunk(Chunk& chunk, const Filter& filter, Composer& composer, bool readsHeaders) {
    for (std::size_t i = 0; i < chunk.size(); ++i) {
        Seen& seen = chunk.seen()[i];
        if (readsHeaders)
            readHeaders(seen);
        if (!filter.passes(seen))
            continue;
        Piece piece{.item = i, .instant = {seen.when.clock, seen.at}};
        composer.compose(seen, chunk.text, piece);
        piece.end = chunk.text.size();
        chunk.pieces.push_back(piece);
    }
}

class Run {
  public:
    Run(capture::Reader& reader, Tracker& tracker, Filter& filter, Consumer& consumer, Chatter& chatter,
        const Work& work)
        : reader_(reader),
          tracker_(tracker),
          filter_(filter),
          consumer_(consumer),
          chatter_(chatter),
          work_(work),
          first_(consumer.countsItself() ? 0 : work.first),
          left_(first_),
          crew_(jobs()) {}

    Outcome run() {
        Next next = Next::item;
        bool more = true;
        bool isFull = false;
        while (more && !isStopped()) {
            next = readChunk();
            const std::size_t most = work_.jobs == 1 ? 0 : work_.jobs * chunksForEachThread;
            const bool nowOrNever = next != capture::Reader::Next::item || work_.eachAtOnce;
            isFull = !handOn(nowOrNever ? 0 : most);
            more = !isFull && next != capture::Reader::Next::end;
            if (nowOrNever)
                consumer_.flush();
            if (more && next == capture::Reader::Next::pause) {
                reader_.wait(longestWait);
                passTime();
            }
            const auto [done, of] = reader_.progress();
            chatter_.progress(done, of);
        }
        if (!isFull && work_.gate != nullptr)
            handInRest();
        isFull = !handOn(0) || isFull;
        consumer_.flush();
        return {!isFull && next == Next::end, passed_};
    }

  private:
    using Next = capture::Reader::Next;
    using HostClock = std::chrono::steady_clock;

    std::vector<Crew::Job> jobs() {
        std::vector<Crew::Job> jobs;
        for (unsigned i = 0; i < work_.jobs; ++i) {
            jobs.emplace_back(
                [this, composer = std::shared_ptr<Composer>(work_.makeComposer())](Chunk& chunk) {
                    composeChunk(chunk, filter_, *composer, tracker_.followsLinks());
                });
        }
        return jobs;
    }

    bool isStopped() const { return work_.stopped != nullptr && work_.stopped->load(); }

    // Reads a chunk and hands it in. Returns why reading stopped.
    Next readChunk() {
        std::unique_ptr<Chunk> chunk = heldBack_ != nullptr ? std::move(heldBack_) : freeChunk();
        std::size_t room = work_.eachAtOnce ? 1 : itemsInChunk;
        Next next = Next::item;
        addReleased(*chunk);
        for (; room > 0 && (next = reader_.next(item_)) == Next::item; --room) {
            const Seen seen = tracker_.see(item_);
            begin(seen.when);
            hasCome_ = true;
            if (work_.gate == nullptr) {
                add(*chunk, seen);
                continue;
            }
            work_.gate->take(seen);
            addReleased(*chunk);
        }
        chunk->seal();
        begun_ = begun_ || !chunk->empty();
        if (filter_.hidesKeepAlives())
            holdBack(*chunk, next);
        crew_.handIn(std::move(chunk));
        return next;
    }

    void add(Chunk& chunk, Seen seen) {
        if (filter_.hidesKeepAlives())
            polls_.take(chunk, seen);
        chunk.add(seen);
    }

    void addReleased(Chunk& chunk) {
        if (work_.gate == nullptr)
            return;
        while (const Seen* const seen = work_.gate->next())
            add(chunk, *seen);
    }

    // Hands in the items that were held, as far as they are wanted.
    void handInRest() {
        std::unique_ptr<Chunk> chunk = heldBack_ != nullptr ? std::move(heldBack_) : freeChunk();
        work_.gate->finish();
        addReleased(*chunk);
        chunk->seal();
        crew_.handIn(std::move(chunk));
    }

    // Nothing has come. Lets time pass by this host's clock.
    void passTime() {
        if (!work_.clockRuns)
            return;
        const HostClock::time_point now = HostClock::now();
        if (std::exchange(hasCome_, false))
            timeUntil_ = now + recorderMayLag;
        if (now <= timeUntil_)
            return;
        const auto passed = std::chrono::duration_cast<std::chrono::nanoseconds>(now - timeUntil_).count();
        timeUntil_ = now;
        consumer_.advance(passed);
        if (work_.gate != nullptr)
            work_.gate->advance(passed);
    }

    // Keeps back the items from the first poll on whose answer may still come, because the answer decides
    // whether the poll is shown.
    void holdBack(Chunk& chunk, Next next) {
        const std::size_t from = polls_.open(chunk, next == Next::end);
        if (from == chunk.size())
            return;
        heldBack_ = freeChunk();
        chunk.split(from, *heldBack_);
    }

    // Tells the filter the first time of the stream, before another thread uses the filter. A stream whose
    // first chunk has no times counts as one without times.
    void begin(Instant first) {
        if (begun_ || first.clock == capture::Clock::none)
            return;
        filter_.begin(first);
        begun_ = true;
    }

    // Hands finished chunks on until no more than `most` are held. False once nothing more is wanted.
    bool handOn(std::size_t most) {
        while (crew_.held() > most) {
            std::unique_ptr<Chunk> chunk = crew_.takeBack();
            std::size_t wanted = chunk->pieces.size();
            passed_ += wanted;
            if (first_ != 0) {
                wanted = std::min<std::uint64_t>(wanted, left_);
                left_ -= wanted;
            }
            if (wanted > 0 || consumer_.wantsAll())
                consumer_.take(*chunk, wanted);
            free_.push_back(std::move(chunk));
            if (first_ != 0 && left_ == 0)
                return false;
        }
        return true;
    }

    std::unique_ptr<Chunk> freeChunk() {
        if (free_.empty())
            return std::make_unique<Chunk>();
        std::unique_ptr<Chunk> chunk = std::move(free_.back());
        free_.pop_back();
        chunk->clear();
        return chunk;
    }

    capture::Reader& reader_;
    Tracker& tracker_;
    Filter& filter_;
    Consumer& consumer_;
    Chatter& chatter_;
    const Work& work_;
    std::uint64_t first_;
    std::uint64_t left_;
    std::uint64_t passed_ = 0;
    bool hasCome_ = true;              // an item has come since time was counted last
    HostClock::time_point timeUntil_;  // the moment up to which time has been counted
    bool begun_ = false;
    capture::Item item_;
    Polls polls_;
    std::unique_ptr<Chunk> heldBack_;
    std::vector<std::unique_ptr<Chunk>> free_;
    Crew crew_;
};

}  // namespace

Outcome runPipeline(capture::Reader& reader, Tracker& tracker, Filter& filter, Consumer& consumer,
                    Chatter& chatter, const Work& work) {
    return Run(reader, tracker, filter, consumer, chatter, work).run();
}

}  // namespace reader
