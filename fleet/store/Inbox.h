// Where parcels come from, as the store sees it: a queue that keeps them until they are acknowledged.
#ifndef FLEET_STORE_INBOX_H
#define FLEET_STORE_INBOX_H

#include <chrono>
#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace fleet {

// A message of the stream, whatever it holds.
struct Letter {
    std::string subject;
    std::string text;
    std::uint64_t sequence = 0;           // in the stream
    std::chrono::nanoseconds storedAt{};  // when the stream took it, since 1970; 0: not known
};

// A letter that cannot be stored.
struct DeadLetter {
    Letter letter;
    std::string reason;  // one line of printable ASCII
};

// The letters of one partition. Used by one thread at a time. Every function throws what its transport
// throws; letters that were fetched and not acknowledged come again, at once or later.
class Inbox {
  public:
    Inbox() = default;
    Inbox(const Inbox&) = delete;
    Inbox& operator=(const Inbox&) = delete;
    virtual ~Inbox() = default;

    // At most `most` letters, in the order of the stream; none if none comes within the time.
    virtual std::vector<Letter> fetch(std::size_t most, std::chrono::milliseconds wait) = 0;
    // Puts it where dead letters are kept, and returns when it is there. May be told of one letter twice.
    virtual void bury(const DeadLetter& dead) = 0;
    // All letters of the last fetch need not come again.
    virtual void acknowledge() = 0;
};

}  // namespace fleet

#endif
