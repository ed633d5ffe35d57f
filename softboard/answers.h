// The commands that a board answers. Each command is a row of a table.
#ifndef SOFTBOARD_ANSWERS_H
#define SOFTBOARD_ANSWERS_H

#include <optional>
#include <span>

#include "softboard/board.h"
#include "softboard/codes.h"
#include "softboard/wire.h"

namespace softboard {

// A command that a board is carrying out, and the reply that is being made.
struct Request {
    Board& board;
    Component* component;  // null when the managers are addressed
    Address from;          // the command's source
    BodyReader body;       // of the command
    BodyWriter reply;      // the body of the reply

    // Makes the board send an error reply with this code instead; `data` becomes its last field.
    void refuse(ErrorCode code, Octets data = {}) {
        error = code;
        errorData = std::move(data);
    }

    std::optional<ErrorCode> error{};
    Octets errorData{};
};

using Action = void (*)(Request&);

// Who answers a command: components, the board's managers, or both.
enum class At { component, managers, both };

struct Answer {
    uint32_t command;
    std::optional<uint32_t> reply;  // message type; none if the command has no reply
    At at;
    Action action;
};

std::span<const Answer> standardAnswers();  // parameters, events
std::span<const Answer> managerAnswers();   // find, use

// The action of a command that changes nothing in the simulated board. It leaves the reply's body empty.
void acknowledge(Request& request);

}  // namespace softboard

#endif
