// A queue of the transport library.
#ifndef RELAY_TRANSPORT_QUEUE_H
#define RELAY_TRANSPORT_QUEUE_H

#include <cstdint>

#include "relay/message.h"

namespace relay {

// Opened, bound, and given back at the end. One thread reads while another writes.
class TransportQueue {
  public:
    TransportQueue();  // throws Ended
    ~TransportQueue();
    TransportQueue(const TransportQueue&) = delete;
    TransportQueue& operator=(const TransportQueue&) = delete;

    const NvCompDesc& address() const { return address_; }

    // Waits for the next message; null when the queue has failed or is closed.
    Message read() const;
    // Sends msg under the queue's own address, whoever it says it is from. False when the library refuses it;
    // gone it is all the same.
    bool write(Message msg) const;

    // An empty message to the queue itself, which comes behind everything that is in the queue. False when
    // the library has no memory for it, or refuses it: it will not come.
    bool mark() const;
    bool isMark(const NvMsg32Bit& msg) const;

    // Ends a read that is under way, where no mark can.
    void close();

  private:
    std::uint32_t handle_;
    NvCompDesc address_{};
    bool open_ = true;
};

}  // namespace relay

#endif
