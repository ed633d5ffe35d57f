// The order in which threads take part in a run.
#ifndef READER_TURNS_H
#define READER_TURNS_H

#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <optional>
#include <vector>

namespace reader {

// Each thread goes through three steps again and again: it reads a chunk, works on it, and hands it on. One
// thread reads at a time, and one hands on at a time, in the order in which the chunks were read. So a chunk
// stays with one processor from its octets to its text. All functions may be called by any thread; what was
// done in one step happens before the same step of the next turn.
class Turns {
  public:
    using Turn = std::uint64_t;

    // For so many threads, each of which has one turn at a time. One of them is the owner.
    explicit Turns(std::size_t threads) : turnHasCome_(threads) {}

    // Waits until no thread reads, and begins a turn with reading. Returns nothing after close().
    std::optional<Turn> beginReading(bool isOwner);
    void endReading() { endReading(false); }
    // Ends reading while there is nothing to read: only the owner begins the next turn.
    void endReadingForOwner() { endReading(true); }

    // Waits until all turns before this one have ended.
    void await(Turn turn);
    // The turn that was waited for ends.
    void end();

    // No more turns begin. Those that have begun must still end.
    void close();

  private:
    void endReading(bool isOwnersNext);

    std::mutex mutex_;  // guards everything below
    std::condition_variable othersMayRead_;
    std::condition_variable ownerMayRead_;
    std::vector<std::condition_variable> turnHasCome_;  // of turn N at N modulo the number of threads
    Turn last_ = 0;                                     // that has begun
    Turn ended_ = 0;                                    // all turns up to this one have ended
    bool isReading_ = false;
    bool isOwnersNext_ = false;
    bool isClosed_ = false;
};

}  // namespace reader

#endif
