// Finds the call of each frame that carries a message without being the frame by which the call hears of it.
#ifndef CALLS_CARRIERS_H
#define CALLS_CARRIERS_H

#include <cstdint>
#include <functional>
#include <list>
#include <string>
#include <vector>

#include "calls/CallTable.h"
#include "calls/Link.h"
#include "calls/Message.h"

namespace calls {

// Such frames are copies that the receiver's layer 2 does not hand up, frames behind a hole, and segments.
// One object serves one D channel. It keeps a frame until the message itself is heard, because only then its
// call is known: when a SETUP is lost and sent again, its call begins with the second copy. Memory is
// bounded.
class Carriers {
  public:
    // The longest time that a frame waits, in nanoseconds of its D channel's clock, and the largest number of
    // frames that wait.
    static constexpr std::int64_t patience = 10 * second;
    static constexpr std::size_t mostWaiting = 64;

    // Is called once for each frame, with the call that it belongs to. The call is null if there is none.
    using Tell = std::function<void(const Message&, const Call*)>;

    // Takes a frame whose message is not handed up now, or is a segment.
    void take(const Message& message, const Marks& marks, const CallTable& table, const Tell& tell);
    // A message was heard. Tells of the waiting frames that carried it, and drops the heard frame itself if
    // it waits.
    void heard(const Message& message, const Call* call, const Tell& tell);
    // Tells of frames that have waited too long; they count for the call that has their call reference now.
    void advance(std::int64_t at, const CallTable& table, const Tell& tell);
    void finish(const CallTable& table, const Tell& tell);

  private:
    // A frame, with copies of everything that the reader owns and will reuse.
    struct Waiting {
        explicit Waiting(const Message& from);
        Waiting(const Waiting&) = delete;
        Waiting& operator=(const Waiting&) = delete;

        std::vector<std::uint8_t> octets;
        std::string file;
        capture::Interface interface;
        capture::Frame frame;
        Message message;
    };

    std::list<Waiting> waiting_;  // oldest first
};

}  // namespace calls

#endif
