// Where the faults of a scenario take hold.
#ifndef SOFTBOARD_MISBEHAVIOUR_H
#define SOFTBOARD_MISBEHAVIOUR_H

#include <map>
#include <optional>
#include <vector>

#include "softboard/faults.h"
#include "softboard/message.h"

namespace softboard {

using Messages = std::vector<Message>;

// What a network without faults would do goes in, what it does instead comes out. Not locked: the network
// that owns it is.
class Misbehaviour {
  public:
    // Events that are wrong come beside the right ones: before the first frame and before each hundredth
    // after it, so that what is right can still be looked for whole.
    static constexpr uint64_t framesBetween = 100;

    Misbehaviour() = default;
    explicit Misbehaviour(std::vector<Fault> faults);

    // Whether this call of the library fails; `kind` says which call it is, and each one counts.
    bool fails(FaultKind kind);
    // What is sent instead of the reply to the command.
    Messages repliesFor(const Message& command, const Message& reply);
    // What is sent ahead of a frame's event.
    Messages aheadOf(const Message& event);
    // What is sent before and once more after the reply to the command.
    Messages beside(const Message& command) const;

    // Frames still to be sent at once, the one at hand included.
    bool bursting() const;
    bool silent() const;
    bool has(FaultKind kind) const { return argument(kind).has_value(); }

  private:
    std::optional<uint32_t> argument(FaultKind kind) const;
    bool isTheNth(FaultKind kind, uint64_t count) const;

    std::vector<Fault> faults_;
    std::map<FaultKind, uint64_t> calls_;
    uint64_t replies_ = 0;
    uint64_t events_ = 0;
    Messages late_;
    std::optional<Message> lastEvent_;
};

}  // namespace softboard

#endif
