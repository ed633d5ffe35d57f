#include "reader/Pipeline.h"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <exception>
#include <system_error>
#include <thread>
#include <utility>
#include <vector>

#include "reader/Polls.h"
#include "reader/Turns.h"

namespace reader {

namespace {

// Large enough that taking turns costs little, small enough that octets and text stay in a processor's cache.
constexpr std::size_t itemsInChunk = 512;
constexpr std::chrono::milliseconds longestWait{500};
// How much later than a frame passed a recorder may write it. Time on this host's clock counts only after
// that.
constexpr std::chrono::seconds recorderMayLag{2};

// If links are not followed, nobody needs headers either.
void composeChunk(Chunk& chunk, const Filter& filter, Composer& composer, bool readsHeaders) {
    for (std::size_t i = 0; i < chunk.size(); ++i) {
        Seen& seen = chunk.seen()[i];
        if (readsHeaders)
            readHeaders(seen);
        if (!filter.passes(seen))
            continue;
        // Filled in where it stands: a copy would wait until the processor has stored all of the text.
        Piece& piece = chunk.pieces.emplace_back();
        piece.item = i;
        piece.end = chunk.text.size();
        piece.instant.clock = seen.when.clock;
        piece.instant.time = seen.at;
        composer.compose(seen, chunk.text, piece);
        piece.end = chunk.text.size();
    }
}

// While one exists, threads that are started get no signals. So signals go to the thread that waits for
// input, and end its waiting.
class WithoutSignals {
  public:
    WithoutSignals() {
        sigset_t all;
        sigfillset(&all);
        pthread_sigmask(SIG_SETMASK, &all, &before_);
    }
    ~WithoutSignals() { pthread_sigmask(SIG_SETMASK, &before_, nullptr); }
    WithoutSignals(const WithoutSignals&) = delete;
    WithoutSignals& operator=(const WithoutSignals&) = delete;

  private:
    sigset_t before_{};
};

// The threads take turns (Turns.h). A member belongs to the thread that reads, or to the one that hands on. A
// thread whose chunk holds all there is just now reads until it has handed on, so that both are the same.
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
          skipped_(consumer.countsItself() ? 0 : work.skipped),
          turns_(std::max(work.jobs, 1U)) {}

    Outcome run() {
        const std::unique_ptr<Composer> composer = work_.makeComposer();
        Chunk chunk;
        takeTurns(chunk, *composer, true);
        for (std::thread& thread : threads_)
            thread.join();
        if (failure_)
            std::rethrow_exception(failure_);
        if (!isFull_)
            handOnRest(chunk, *composer);
        consumer_.flush();
        return {hasEnded_ && !isFull_, passed_};
    }

  private:
    using Next = capture::Reader::Next;
    using HostClock = std::chrono::steady_clock;

    // The owner is the thread of run().
    void takeTurns(Chunk& chunk, Composer& composer, bool isOwner) {
        while (const auto turn = turns_.beginReading(isOwner)) {
            std::exception_ptr thrown;
            Next next = Next::end;
            attempt(thrown, [&] { next = read(chunk, isOwner); });
            chunk.seal();
            const bool isAlone = next != Next::item || work_.eachAtOnce;
            if (!isAlone)
                turns_.endReading();
            if (!isAlone && isOwner && threads_.empty())
                startOthers();
            attempt(thrown, [&] { compose(chunk, composer); });
            turns_.await(*turn);
            attempt(thrown, [&] { handOn(chunk, isAlone); });
            if (failure_ == nullptr)
                failure_ = thrown;
            if (isFull_ || failure_ != nullptr || next == Next::end)
                turns_.close();
            turns_.end();
            if (isAlone)
                endReading(next);
        }
    }

    // Keeps the first of several exceptions. What was read before it is still handed on.
    template <class Act>
    static void attempt(std::exception_ptr& thrown, Act act) {
        try {
            act();
        } catch (...) {
            if (thrown == nullptr)
                thrown = std::current_exception();
        }
    }

    void endReading(Next next) {
        if (next == Next::pause)
            turns_.endReadingForOwner();
        else
            turns_.endReading();
    }

    // Called once there is more than one chunk. If the system has no thread left, fewer do the work.
    void startOthers() {
        const WithoutSignals none;
        try {
            for (unsigned i = 1; i < work_.jobs; ++i) {
                std::shared_ptr<Composer> composer = work_.makeComposer();
                threads_.emplace_back([this, composer = std::move(composer)] {
                    Chunk chunk;
                    takeTurns(chunk, *composer, false);
                });
            }
        } catch (const std::system_error&) {
        }
    }

    bool isStopped() const { return work_.stopped != nullptr && work_.stopped->load(); }

    // Fills the chunk. Returns why it holds no more. After a pause the owner waits first.
    Next read(Chunk& chunk, bool isOwner) {
        chunk.clear();
        if (isOwner && std::exchange(isPaused_, false)) {
            reader_.wait(longestWait);
            passTime();
        }
        if (isStopped())
            return Next::end;
        const Next next = fill(chunk);
        isPaused_ = next == Next::pause;
        hasEnded_ = next == Next::end;
        const capture::Reader::Progress progress = reader_.progress();
        chatter_.progress(progress.octets, progress.of);
        return next;
    }

    Next fill(Chunk& chunk) {
        takeHeldBack(chunk);
        std::size_t room = work_.eachAtOnce ? 1 : itemsInChunk;
        Next next = Next::item;
        addReleased(chunk);
        for (; room > 0 && (next = reader_.next(item_)) == Next::item; --room) {
            hasCome_ = true;
            if (work_.gate == nullptr) {
                Seen& seen = chunk.add(item_);
                tracker_.see(item_, seen);
                begin(seen.when);
                lookForPolls(chunk, seen);
                continue;
            }
            const Seen seen = tracker_.see(item_);
            begin(seen.when);
            work_.gate->take(seen);
            addReleased(chunk);
        }
        begun_ = begun_ || !chunk.empty();
        if (filter_.hidesKeepAlives())
            holdBack(chunk, next);
        return next;
    }

    // Moves what was held back into an empty chunk. If that is nothing, each thread keeps its own memory,
    // which is in its processor's cache.
    void takeHeldBack(Chunk& chunk) {
        if (!heldBack_.empty())
            std::swap(chunk, heldBack_);
    }

    void lookForPolls(Chunk& chunk, Seen& seen) {
        if (filter_.hidesKeepAlives())
            polls_.take(chunk, seen);
    }

    void addReleased(Chunk& chunk) {
        if (work_.gate == nullptr)
            return;
        while (const Seen* const seen = work_.gate->next())
            lookForPolls(chunk, chunk.add(*seen));
    }

    // Hands on the items that were held back, and of those at the gate as many as are wanted. Called when no
    // other thread is left.
    void handOnRest(Chunk& chunk, Composer& composer) {
        chunk.clear();
        takeHeldBack(chunk);
        if (work_.gate != nullptr)
            work_.gate->finish();
        addReleased(chunk);
        chunk.seal();
        compose(chunk, composer);
        handOn(chunk, false);
    }

    void compose(Chunk& chunk, Composer& composer) const {
        composeChunk(chunk, filter_, composer, tracker_.followsLinks());
    }

    // Called while nothing comes: tells the consumer how much time has passed on this host's clock.
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

    // Keeps the items from a poll on whose answer may still come: whether the poll is shown depends on that.
    void holdBack(Chunk& chunk, Next next) {
        chunk.seal();
        const std::size_t from = polls_.open(chunk, next == Next::end);
        heldBack_.clear();
        if (from != chunk.size())
            chunk.split(from, heldBack_);
    }

    // Tells the filter what the first time of the stream is, while no other thread asks it. A stream whose
    // first chunk has no time is one without times.
    void begin(Instant first) {
        if (begun_ || first.clock == capture::Clock::none)
            return;
        filter_.begin(first);
        begun_ = true;
    }

    // The number of pieces up to the one with which `frames` frames are counted, or all. Counts `frames`
    // down. A line that says something between frames, such as that some were lost, is not counted.
    static std::size_t piecesOf(Chunk& chunk, std::uint64_t& frames) {
        std::size_t pieces = 0;
        while (pieces < chunk.pieces.size() && frames != 0) {
            if (chunk.seen()[chunk.pieces[pieces++].item].number != 0)
                --frames;
        }
        return pieces;
    }

    // Hands on nothing after the last piece that is wanted, or after a failure.
    void handOn(Chunk& chunk, bool flushes) {
        if (isFull_ || failure_ != nullptr)
            return;
        passed_ += chunk.pieces.size();
        if (skipped_ != 0)
            chunk.dropPieces(piecesOf(chunk, skipped_));
        std::size_t wanted = chunk.pieces.size();
        if (first_ != 0) {
            wanted = piecesOf(chunk, left_);
            isFull_ = left_ == 0;
        }
        if (wanted > 0 || consumer_.wantsAll())
            consumer_.take(chunk, wanted);
        if (flushes)
            consumer_.flush();
    }

    capture::Reader& reader_;
    Tracker& tracker_;
    Filter& filter_;
    Consumer& consumer_;
    Chatter& chatter_;
    const Work& work_;
    // They belong to the thread that reads.
    bool hasEnded_ = false;            // the input
    bool isPaused_ = false;            // it has nothing more just now
    bool hasCome_ = true;              // an item, since time was counted last
    HostClock::time_point timeUntil_;  // time has been counted up to then
    bool begun_ = false;
    capture::Item item_;
    Polls polls_;
    Chunk heldBack_;
    // These belong to the thread that hands on.
    std::uint64_t first_;
    std::uint64_t left_;
    std::uint64_t skipped_;  // that are still to be left out
    std::uint64_t passed_ = 0;
    bool isFull_ = false;
    std::exception_ptr failure_;

    Turns turns_;
    std::vector<std::thread> threads_;
};

}  // namespace

Outcome runPipeline(capture::Reader& reader, Tracker& tracker, Filter& filter, Consumer& consumer,
                    Chatter& chatter, const Work& work) {
    return Run(reader, tracker, filter, consumer, chatter, work).run();
}

}  // namespace reader
