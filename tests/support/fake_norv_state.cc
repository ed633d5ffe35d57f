#include "tests/support/fake_norv_state.h"

#include <algorithm>
#include <cstdlib>
#include <utility>

namespace fake_norv {

State& state() {
    static State theState;
    return theState;
}

bool same(NvCompDesc a, NvCompDesc b) {
    return a.instance == b.instance && a.board == b.board && a.processor == b.processor &&
           a.component == b.component && a.node == b.node;
}

std::string hex(std::uint32_t value) {
    std::ostringstream out;
    out << "0x" << std::hex << value;
    return out.str();
}

std::uint32_t record(State& s, Call call) {
    const std::uint32_t status = call.status;
    s.calls.push_back(std::move(call));
    s.changed.notify_all();
    return status;
}

void misuse(State& s, const std::string& what) { s.misuses.push_back(what); }

bool fails(State& s, Op op) {
    const auto found = s.faults.find(op);
    if (found == s.faults.end() || found->second.times == 0)
        return false;
    if (found->second.after > 0) {
        --found->second.after;
        return false;
    }
    --found->second.times;
    return true;
}

NvMsg32Bit* newBuffer(State& s, std::uint32_t size) {
    const std::size_t whole = std::size_t{size} + NVMSG_OVERHEAD;
    auto* const msg = static_cast<NvMsg32Bit*>(std::calloc(1, whole));
    if (msg == nullptr)
        return nullptr;
    msg->transaction = lowOctet;
    msg->size = size;
    std::fill(octets(msg) + NVMSG_HEADER_SIZE + size, octets(msg) + whole, tailOctet);
    s.buffers[msg] = Buffer();
    return msg;
}

void release(State& s, NvMsg32Bit* msg) {
    s.buffers.erase(msg);
    std::free(msg);
}

Buffer* callersBuffer(State& s, NvMsg32Bit* msg, const char* function) {
    const auto found = s.buffers.find(msg);
    if (found == s.buffers.end())
        misuse(s, text(function, ": a buffer that is not allocated"));
    else if (found->second.withLibrary)
        misuse(s, text(function, ": a buffer that the library holds"));
    else
        return &found->second;
    return nullptr;
}

Queue* openQueue(State& s, std::uint32_t handle, const char* function) {
    const auto found = s.queues.find(handle);
    if (found == s.queues.end()) {
        misuse(s, text(function, ": no queue ", handle));
        return nullptr;
    }
    return &found->second;
}

Queue* boundTo(State& s, NvCompDesc address) {
    for (auto& [handle, queue] : s.queues) {
        if (queue.bound && same(queue.address, address))
            return &queue;
    }
    return nullptr;
}

Message seen(NvMsg32Bit* msg) {
    Message message;
    message.transaction = msg->transaction >> 8;
    message.type = msg->type;
    message.source = {msg->sourceInstance,  msg->sourceBoard, 0, msg->sourceProcessor,
                      msg->sourceComponent, msg->sourceNode,  0};
    message.target = {msg->targetInstance,  msg->targetBoard, 0, msg->targetProcessor,
                      msg->targetComponent, msg->targetNode,  0};
    const std::uint8_t* const body = octets(msg) + NVMSG_HEADER_SIZE;
    message.body.assign(body, body + msg->size);
    return message;
}

void fill(NvMsg32Bit* msg, const Message& from) {
    msg->transaction = (from.transaction << 8) | lowOctet;
    msg->type = from.type;
    msg->sourceInstance = from.source.instance;
    msg->sourceBoard = from.source.board;
    msg->sourceProcessor = from.source.processor;
    msg->sourceComponent = from.source.component;
    msg->sourceNode = from.source.node;
    msg->targetInstance = from.target.instance;
    msg->targetBoard = from.target.board;
    msg->targetProcessor = from.target.processor;
    msg->targetComponent = from.target.component;
    msg->targetNode = from.target.node;
    std::copy(from.body.begin(), from.body.end(), octets(msg) + NVMSG_HEADER_SIZE);
}

void enqueue(State& s, Queue& queue, NvMsg32Bit* msg) {
    s.buffers[msg].withLibrary = true;
    msg->size = static_cast<std::uint32_t>(std::min<std::size_t>(msg->size, s.mostOctets));
    queue.pending.push_back(msg);
    s.changed.notify_all();
}

}  // namespace fake_norv
