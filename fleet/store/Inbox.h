// The interface through which the store takes parcels: a queue that keeps messages until they are
// acknowledged.
#ifndef FLEET_STORE_INBOX_H
#define FLEET_STORE_INBOX_H

#include <chrono>
#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace fleet {

// A message of the stream. Its text may be a parcel or anything else.
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

// Gives the letters of one partition. Letters that were fetched and not acknowledged come again, with the
// next fetch or later. Every function throws what its transport throws. Used by one thread at a time.
class Inbox {
  public:
    Inbox() = default;
    Inbox(const Inbox&) = delete;
    Inbox& operator=(const Inbox&) = delete;
    virtual ~Inbox() = default;

    // Returns at most `most` letters in the order of the stream; none if none comes within `wait`.
    virtual std::vector<Letter> fetch(std::size_t most, std::chrono::milliseconds wait) = 0;
    // Puts a letter where dead letters are kept, and returns when it is there. May be called twice for one
    // letter.
    virtual void bury(const DeadLetter& dead) = 0;
    // Acknowledges all letters of the last fetch, so that they do not come again.
    virtual void acknowledge() = 0;
};

}  // namespace fleet

#endif
