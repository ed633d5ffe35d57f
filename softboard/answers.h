// The commands that a board answers, a row each.
#ifndef SOFTBOARD_ANSWERS_H
#define SOFTBOARD_ANSWERS_H

#include <optional>
#include <span>

#include "softboard/board.h"
#include "softboard/codes.h"
#include "softboard/wire.h"

namespace softboard {

// A command being carried out.
struct Request {
    Board& board;
    Component* component;  // null when the managers are addressed
    Address from;          // the command's source
    BodyReader body;       // the command's
    BodyWriter reply;      // the reply's body

    // Turns the reply into an error reply; data is what its last field holds.
    void refuse(ErrorCode code, Octets data = {}) {
        error = code;
        errorData = std::move(data);
    }

    std::optional<ErrorCode> error{};
    Octets errorData{};
};

using Action = void (*)(Request&);

// Who answers: components, the board's managers, or both.
enum class At { component, managers, both };

struct Answer {
    uint32_t command;
    std::optional<uint32_t> reply;  // none: the command is carried out in silence
    At at;
    Action action;
};

std::span<const Answer> standardAnswers();  // parameters, events
std::span<const Answer> managerAnswers();   // find, use

void acknowledge(Request& request);

}  // namespace softboard

#endif
