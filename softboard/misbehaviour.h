// Applies the faults of a scenario to what the network does.
#ifndef SOFTBOARD_MISBEHAVIOUR_H
#define SOFTBOARD_MISBEHAVIOUR_H

#include <map>
#include <optional>
#include <vector>

#include "softboard/faults.h"
#include "softboard/message.h"

namespace softboard {

using Messages = std::vector<Message>;

// The network tells what it would do without faults, and is told what to do instead. The class has no lock:
// the Network that owns it calls it under the network's lock.
class Misbehaviour {
  public:
    // A wrong event is sent in addition to the right ones, before the first frame and before each hundredth
    // after it. So a test can still look for every right event.
    static constexpr uint64_t framesBetween = 100;

    Misbehaviour() = default;
    explicit Misbehaviour(std::vector<Fault> faults);

    // Whether this call of the library fails. `kind` is the fault of that call (openFails, for example);
    // every call counts, and the fault's number says which one fails.
    bool fails(FaultKind kind);
    // The messages to send instead of the reply to the command: none, one or several.
    Messages repliesFor(const Message& command, const Message& reply);
    // The wrong events to send before the event of a frame. Call it once for every event of a frame.
    Messages aheadOf(const Message& event);
    // The events to send before the reply to the command, and to send again after it.
    Messages beside(const Message& command) const;

    // Whether the next frame belongs to a burst, and is sent without waiting.
    bool bursting() const;
    // Whether the boards have fallen silent: no frames, no replies, no command carried out.
    bool silent() const;
    bool has(FaultKind kind) const { return argument(kind).has_value(); }

  private:
    std::optional<uint32_t> argument(FaultKind kind) const;
    bool isTheNth(FaultKind kind, uint64_t count) const;

    std::vector<Fault> faults_;
    std::map<FaultKind, uint64_t> calls_;
    uint64_t replies_ = 0;
    uint64_t events_ = 0;
    Messages late_;                     // replies to send with the next reply
    std::optional<Message> lastEvent_;  // the event that eventsWhileStopping sends again
};

}  // namespace softboard

#endif
