#include "relay/transport_queue.h"

#include "relay/ended.h"

namespace relay {

namespace {

// The transaction of a mark. Boards do not send it. A host that sends such a message to its own queue
// receives that message, or a mark, which looks the same.
constexpr std::uint32_t markTransaction = 0xFFFFFF;

}  // namespace

TransportQueue::TransportQueue() : handle_(nvQueueOpen()) {
    if (handle_ == NVSTATUS_ERROR)
        throw Ended("the transport library opens no more queues");
    if (nvQueueBind(handle_, &address_) == NVSTATUS_ERROR) {
        nvQueueClose(handle_);
        throw Ended("the transport library binds no more queues");
    }
}

TransportQueue::~TransportQueue() { close(); }

void TransportQueue::close() {
    if (!open_)
        return;
    open_ = false;
    nvQueueUnbind(handle_, address_);
    nvQueueClose(handle_);
}

Message TransportQueue::read() const {
    NvMsg32Bit* msg = nullptr;
    return Message(nvMsgRead(handle_, 0, &msg) == NVSTATUS_OK ? msg : nullptr);
}

bool TransportQueue::write(Message msg) const {
    setSource(*msg, address_);
    return nvMsgWrite(handle_, msg.release(), 0) == NVSTATUS_OK;
}

bool TransportQueue::mark() const {
    Message msg = newMessage(0);
    if (msg == nullptr)
        return false;
    msg->transaction = markTransaction << 8 | (msg->transaction & 0xFFU);
    msg->type = 0;
    setTarget(*msg, address_);
    return write(std::move(msg));
}

bool TransportQueue::isMark(const NvMsg32Bit& msg) const {
    return msg.transaction >> 8 == markTransaction && msg.type == 0 && msg.size == 0 &&
           same(sourceOf(msg), address_);
}

}  // namespace relay
