#include "softboard/message.h"

#include <cstring>

namespace softboard {

Address addressOf(const NvCompDesc& nv) {
    return {nv.instance, nv.board, nv.processor, nv.component, nv.node};
}

NvCompDesc compDescOf(const Address& address) {
    return {address.instance, address.board, 0, address.processor, address.component, address.node, 0};
}

std::string toString(const Address& address) {
    std::string text;
    for (const unsigned part : {address.node, address.board, address.processor, address.component}) {
        text += std::to_string(part) + '/';
    }
    return text + std::to_string(address.instance);
}

Message messageOf(const NvMsg32Bit& nv) {
    Message message;
    message.transaction = nv.transaction;
    message.type = nv.type;
    message.source = {nv.sourceInstance, nv.sourceBoard, nv.sourceProcessor, nv.sourceComponent,
                      nv.sourceNode};
    message.target = {nv.targetInstance, nv.targetBoard, nv.targetProcessor, nv.targetComponent,
                      nv.targetNode};
    const auto* body = reinterpret_cast<const uint8_t*>(&nv) + NVMSG_HEADER_SIZE;
    message.body.assign(body, body + nv.size);
    return message;
}

void store(const Message& message, NvMsg32Bit& nv) {
    nv.transaction = message.transaction;
    nv.type = message.type;
    nv.sourceInstance = message.source.instance;
    nv.sourceBoard = message.source.board;
    nv.sourceProcessor = message.source.processor;
    nv.sourceNode = message.source.node;
    nv.sourceComponent = message.source.component;
    nv.targetInstance = message.target.instance;
    nv.targetBoard = message.target.board;
    nv.targetProcessor = message.target.processor;
    nv.targetNode = message.target.node;
    nv.targetComponent = message.target.component;
    nv.size = static_cast<uint32_t>(message.body.size());
    if (!message.body.empty()) {
        std::memcpy(reinterpret_cast<uint8_t*>(&nv) + NVMSG_HEADER_SIZE, message.body.data(),
                    message.body.size());
    }
}

}  // namespace softboard
