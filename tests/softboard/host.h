// A host on the software board, through the transport's own functions: opens a queue, sends, reads.
#ifndef TESTS_SOFTBOARD_HOST_H
#define TESTS_SOFTBOARD_HOST_H

#include <cstdint>
#include <cstring>

#include "norv/norv.h"
#include "softboard/message.h"

namespace softboard {

class Host {
  public:
    Host() : queue_(nvQueueOpen()) {
        NvCompDesc host{};
        nvQueueBind(queue_, &host);
        address_ = addressOf(host);
    }
    ~Host() {
        nvQueueUnbind(queue_, compDescOf(address_));
        nvQueueClose(queue_);
    }
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    uint32_t queue() const { return queue_; }
    Address address() const { return address_; }

    void send(uint32_t type, const Address& target, const Octets& body = {}, uint32_t transaction = 10000) {
        NvMsg32Bit* msg = nullptr;
        nvMsgAllocate(static_cast<uint32_t>(body.size()), &msg);
        store({transaction << 8, type, address_, target, body}, *msg);
        nvMsgWrite(queue_, msg, 0);
    }

    // The next message of the queue.
    Message read() {
        NvMsg32Bit* msg = nullptr;
        if (nvMsgRead(queue_, 0, &msg) != NVSTATUS_OK) {
            return {};
        }
        Message message = messageOf(*msg);
        nvMsgFree(msg);
        return message;
    }

    Message ask(uint32_t type, const Address& target, const Octets& body = {}, uint32_t transaction = 10000) {
        send(type, target, body, transaction);
        return read();
    }

  private:
    uint32_t queue_;
    Address address_;
};

}  // namespace softboard

#endif
