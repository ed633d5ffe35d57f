#include "softboard/board.h"

#include <algorithm>

#include "softboard/answers.h"
#include "softboard/codes.h"
#include "softboard/wire.h"

namespace softboard {

namespace {

const Answer* findAnswer(uint32_t command, bool managers) {
    const At here = managers ? At::managers : At::component;
    for (const auto& table : {standardAnswers(), managerAnswers()}) {
        for (const Answer& answer : table) {
            if (answer.command == command && (answer.at == here || answer.at == At::both)) {
                return &answer;
            }
        }
    }
    return nullptr;
}

Message replyTo(const Message& command, uint32_t type, Octets body) {
    return {command.transaction, type, command.target, command.source, std::move(body)};
}

Message errorReply(const Message& command, ErrorCode code, const Octets& data = {}) {
    BodyWriter body;
    body.u32(command.type).u32(static_cast<uint32_t>(code)).octets(data);
    return replyTo(command, msgError, body.take());
}

}  // namespace

Component* Board::at(const Address& address) {
    const auto found = std::find_if(components_.begin(), components_.end(),
                                    [&](const Component& component) { return component.address == address; });
    return found == components_.end() ? nullptr : &*found;
}

std::optional<Message> Board::answer(const Message& command) {
    const bool managers = command.target == address();
    Component* component = managers ? nullptr : at(command.target);
    if (!managers && component == nullptr) {
        return errorReply(command, ErrorCode::noSuchComponent);
    }
    const Answer* row = findAnswer(command.type, managers);
    if (row == nullptr) {
        return errorReply(command, ErrorCode::unknownCommand);
    }
    Request request{*this, component, command.source, BodyReader(command.body), {}};
    row->action(request);
    if (request.error) {
        return errorReply(command, *request.error, request.errorData);
    }
    if (!row->reply) {
        return std::nullopt;
    }
    return replyTo(command, *row->reply, request.reply.take());
}

}  // namespace softboard
