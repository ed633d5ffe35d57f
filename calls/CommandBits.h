// Finds out from the frames of a link which of them are commands, and so which end is the user.
#ifndef CALLS_COMMANDBITS_H
#define CALLS_COMMANDBITS_H

#include <array>
#include <cstdint>
#include <optional>

#include "calls/Message.h"
#include "capture/Frame.h"
#include "isdn/Layer2.h"

namespace calls {

constexpr std::size_t indexOf(Side side) { return static_cast<std::size_t>(side); }

// Commands of the user and responses of the network have C/R 0; commands of the network and responses of the
// user have 1 (Q.921 3.3.2). The first frame whose type is always a command, or always a response, shows how
// its sender codes commands. The other side then codes them the other way. A poll and its answer carry the
// same value, and the earlier of the two is the command.
class CommandBits {
  public:
    enum class Lesson : std::uint8_t {
        nothing,       // the frame says nothing, or nothing new
        learnt,        // from now on commands are known
        contradicted,  // the frame codes a command otherwise than an earlier one of its sender
        sameRole       // both sides code commands alike
    };

    // `longest` is how long after a poll its answer may come, in nanoseconds.
    Lesson learn(const isdn::Layer2& frame, Side from, std::int64_t at, std::int64_t longest);

    // Whether a frame with this C/R bit is a command. Empty until it is known.
    std::optional<bool> isCommand(bool cr, Side from) const;
    // The role of our side.
    capture::Role role() const;

  private:
    struct Poll {
        bool cr;
        Side from;
        std::int64_t at;
    };

    Lesson learn(bool commandBit, Side from);

    std::array<std::optional<bool>, 2> bits_;  // by side: the C/R bit of its commands, as its own frames show
    std::optional<Poll> poll_;                 // the last frame with P/F set, until the commands are known
};

}  // namespace calls

#endif
