#include "relay/message.h"

#include <algorithm>
#include <array>
#include <limits>
#include <string>

#include "relay/ended.h"

namespace relay {

namespace {

constexpr unsigned transactionBits = 24;

std::uint8_t* bodyOf(NvMsg32Bit& msg) { return reinterpret_cast<std::uint8_t*>(&msg) + NVMSG_HEADER_SIZE; }

std::span<const std::uint8_t> bodyOf(const NvMsg32Bit& msg) {
    return {reinterpret_cast<const std::uint8_t*>(&msg) + NVMSG_HEADER_SIZE, msg.size};
}

// Reads the words of a header block one after another. Throws Ended for a word that its field cannot hold.
class Words {
  public:
    explicit Words(std::span<const std::uint8_t> octets) : octets_(octets) {}

    template <typename Field>
    Field next() {
        const std::uint32_t word = wordAt(octets_, index_++);
        if (word > std::numeric_limits<Field>::max())
            throw Ended("word " + std::to_string(index_) + " of a header block is " + std::to_string(word));
        return static_cast<Field>(word);
    }

  private:
    std::span<const std::uint8_t> octets_;
    std::size_t index_ = 0;
};

void checkSizes(const Frame& frame) {
    if (frame.data.size() != headerBlockSize)
        throw Ended("a header block of " + std::to_string(frame.data.size()) + " octets");
    const std::uint32_t bodySize = wordAt(frame.data, headerBlockSize / 4 - 1);
    if (bodySize != frame.extra.size())
        throw Ended("a body of " + std::to_string(frame.extra.size()) + " octets that should have " +
                    std::to_string(bodySize));
}

}  // namespace

Message newMessage(std::uint32_t bodySize) {
    NvMsg32Bit* msg = nullptr;
    nvMsgAllocate(bodySize, &msg);
    return Message(msg);
}

Octets encodeMessage(const NvMsg32Bit& msg) {
    Octets block;
    block.reserve(headerBlockSize);
    for (const std::uint32_t word : std::initializer_list<std::uint32_t>{
             msg.transaction & 0xFFU, msg.transaction >> 8, msg.type, msg.sourceNode, msg.sourceBoard,
             msg.sourceProcessor, msg.targetNode, msg.targetBoard, msg.targetProcessor, msg.sourceInstance,
             msg.sourceComponent, msg.targetInstance, msg.targetComponent, msg.size})
        appendWord(block, word);
    return encodeFrame(frame_type::message, 0, block, bodyOf(msg));
}

Message decodeMessage(const Frame& frame) {
    checkSizes(frame);
    Message msg = newMessage(static_cast<std::uint32_t>(frame.extra.size()));
    if (msg == nullptr)
        throw Ended("the transport library has no memory for a message");
    Words words(frame.data);
    const auto low = words.next<std::uint8_t>();
    const auto transaction = words.next<std::uint32_t>();
    if (transaction >> transactionBits != 0)
        throw Ended("transaction " + std::to_string(transaction));
    msg->transaction = transaction << 8 | low;
    msg->type = words.next<std::uint32_t>();
    msg->sourceNode = words.next<std::uint8_t>();
    msg->sourceBoard = words.next<std::uint8_t>();
    msg->sourceProcessor = words.next<std::uint8_t>();
    msg->targetNode = words.next<std::uint8_t>();
    msg->targetBoard = words.next<std::uint8_t>();
    msg->targetProcessor = words.next<std::uint8_t>();
    msg->sourceInstance = words.next<std::uint16_t>();
    msg->sourceComponent = words.next<std::uint8_t>();
    msg->targetInstance = words.next<std::uint16_t>();
    msg->targetComponent = words.next<std::uint8_t>();
    std::copy(frame.extra.begin(), frame.extra.end(), bodyOf(*msg));
    return msg;
}

Octets encodeAddress(const NvCompDesc& address) {
    Octets words;
    for (const std::uint32_t word : std::initializer_list<std::uint32_t>{
             address.node, address.board, address.processor, address.component, address.instance})
        appendWord(words, word);
    return words;
}

NvCompDesc sourceOf(const NvMsg32Bit& msg) {
    return {msg.sourceInstance,  msg.sourceBoard, 0, msg.sourceProcessor,
            msg.sourceComponent, msg.sourceNode,  0};
}

NvCompDesc targetOf(const NvMsg32Bit& msg) {
    return {msg.targetInstance,  msg.targetBoard, 0, msg.targetProcessor,
            msg.targetComponent, msg.targetNode,  0};
}

void setSource(NvMsg32Bit& msg, const NvCompDesc& source) {
    msg.sourceInstance = source.instance;
    msg.sourceBoard = source.board;
    msg.sourceProcessor = source.processor;
    msg.sourceComponent = source.component;
    msg.sourceNode = source.node;
}

void setTarget(NvMsg32Bit& msg, const NvCompDesc& target) {
    msg.targetInstance = target.instance;
    msg.targetBoard = target.board;
    msg.targetProcessor = target.processor;
    msg.targetComponent = target.component;
    msg.targetNode = target.node;
}

bool same(const NvCompDesc& a, const NvCompDesc& b) {
    return a.instance == b.instance && a.board == b.board && a.processor == b.processor &&
           a.component == b.component && a.node == b.node;
}

}  // namespace relay
