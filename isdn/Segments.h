// A message that was too long for one frame, put together from its segments (Q.931 annex H).
#ifndef ISDN_SEGMENTS_H
#define ISDN_SEGMENTS_H

#include <cstdint>
#include <vector>

#include "isdn/Layer3.h"

namespace isdn {

// Takes the messages of one link and one call reference in their order, and collects the segments among them.
// It holds at most eight segments of 260 octets. An object belongs to one thread.
class Segments {
  public:
    enum class Outcome : std::uint8_t {
        none,      // the message is no segment
        waiting,   // it is one, and more must come
        complete,  // it was the last: message() is the whole
        stray,     // it fits nothing that came before, and is dropped
    };

    Outcome add(const Layer3& message);
    // Drops what was collected: timer T314 ran out, or the link was lost.
    void clear();

    // Segments are collected, and more must come.
    bool pending() const { return pending_; }
    // The last message made add() drop what was collected before, because it did not go on with it.
    bool dropped() const { return dropped_; }
    // After `complete`, until add() or clear() is called: discriminator, call reference, message type,
    // elements.
    Octets message() const { return message_; }

  private:
    std::vector<std::uint8_t> message_;
    bool pending_ = false;
    bool dropped_ = false;
    std::uint8_t type_ = 0;       // of the message that was cut
    std::uint8_t remaining_ = 0;  // segments that must still come
};

}  // namespace isdn

#endif
