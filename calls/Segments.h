// Puts the messages together that a side has sent in segments (Q.931 annex H).
#ifndef CALLS_SEGMENTS_H
#define CALLS_SEGMENTS_H

#include <compare>
#include <cstdint>
#include <map>
#include <optional>
#include <utility>
#include <vector>

#include "calls/Call.h"
#include "calls/Message.h"

namespace calls {

// One object serves both sides of one link. Memory is bounded: it keeps at most 64 messages of at most eight
// segments.
class Segments {
  public:
    enum class Taken : std::uint8_t {
        no,         // the message is no segment
        kept,       // more segments must come
        complete,   // `message.layer3` is the whole message now, valid until the next call
        outOfOrder  // a segment without its beginning, one that does not follow, or one too many: dropped
    };
    Taken take(Message& message);

    // The last segment that came of a message whose next segment did not come in time.
    struct Unfinished {
        Moment moment;
        Side from;
    };
    // The last segment of a message that the side did not complete before it began the next one of the same
    // call reference; it is returned once. Ask after each take().
    std::optional<Unfinished> replaced() { return std::exchange(replaced_, std::nullopt); }
    // Forgets a message whose next segment has not come for `limit` nanoseconds, and returns its last one.
    // Call it until it returns nothing.
    std::optional<Unfinished> unfinished(std::int64_t at, std::int64_t limit);
    bool empty() const { return pieces_.empty(); }
    // When the last segment came of the message that has waited longest; there must be one.
    std::int64_t oldest() const;

  private:
    static constexpr std::size_t mostMessages = 64;
    static constexpr unsigned mostSegments = 8;  // Q.931 H.2

    struct Key {
        std::uint64_t reference;
        Side from;
        bool flag;
        auto operator<=>(const Key&) const = default;
    };
    struct Pieces {
        std::vector<std::uint8_t> octets;  // of the message before it was divided
        std::uint8_t type = 0;
        unsigned remaining = 0;
        Moment moment;
    };

    std::map<Key, Pieces> pieces_;
    std::optional<Unfinished> replaced_;
    std::vector<std::uint8_t> whole_;
};

}  // namespace calls

#endif
