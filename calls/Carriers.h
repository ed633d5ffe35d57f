// Frames that carry a message of a call, but are not the one by which the call hears of it.
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

// Of one D channel: copies that the receiver's layer 2 does not hand up, frames behind a hole, and segments.
// Such a frame waits until the message itself is heard, since that alone shows whose it is: a SETUP that is
// lost and sent again begins its call only with the second copy. Memory is bounded.
class Carriers {
  public:
    // A frame waits no longer than this, in nanoseconds of its D channel's clock, and no more of them wait.
    static constexpr std::int64_t patience = 10 * second;
    static constexpr std::size_t mostWaiting = 64;

    // Told once of each frame; `call` is null if it belongs to none.
    using Tell = std::function<void(const Message&, const Call*)>;

    // A frame whose message is not handed up now, or is a segment.
    void take(const Message& message, const Marks& marks, const CallTable& table, const Tell& tell);
    // A message was heard: frames that carried it are told of, and the heard one waits no longer.
    void heard(const Message& message, const Call* call, const Tell& tell);
    // What has waited too long belongs to the call that has its reference now.
    void advance(std::int64_t at, const CallTable& table, const Tell& tell);
    void finish(const CallTable& table, const Tell& tell);

  private:
    // A frame with copies of all that its reader only lends.
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
