// A queue of the transport library.
#ifndef RELAY_TRANSPORT_QUEUE_H
#define RELAY_TRANSPORT_QUEUE_H

#include <cstdint>

#include "relay/message.h"

namespace relay {

// Opens and binds a queue, and closes it at its end. One thread may read while another writes.
class TransportQueue {
  public:
    TransportQueue();  // throws Ended when the library opens or binds no more queues
    ~TransportQueue();
    TransportQueue(const TransportQueue&) = delete;
    TransportQueue& operator=(const TransportQueue&) = delete;

    const NvCompDesc& address() const { return address_; }

    // Waits for the next message. Null when the queue has failed or is closed.
    Message read() const;
    // Sends msg with this queue's address as its source, whatever source it names. Returns false when the
    // library refuses it. The message is given to the library in either case.
    bool write(Message msg) const;

    // Sends a mark, which is an empty message, to this queue itself. Whoever reads it knows that all messages
    // before it have been read. Returns false when the library has no memory for the mark or refuses it.
    bool mark() const;
    bool isMark(const NvMsg32Bit& msg) const;

    // Closes the queue. A thread that waits in read() returns; this ends it when a mark cannot be sent.
    void close();

  private:
    std::uint32_t handle_;
    NvCompDesc address_{};
    bool open_ = true;
};

}  // namespace relay

#endif
