// The host's message queues.
//
// The classes have no lock. The Network that owns them calls them under the network's lock.
#ifndef SOFTBOARD_QUEUES_H
#define SOFTBOARD_QUEUES_H

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>

#include "softboard/message.h"

namespace softboard {

struct Queue {
    bool open = true;
    bool bound = false;
    bool everBound = false;
    Address host;
    std::deque<NvMsg32Bit*> waiting;  // unread messages; the library owns their buffers
    std::condition_variable arrived;  // a message has arrived, or the queue was closed
};

// A handle is never used again for another queue, so that a call on a closed queue does not reach a queue
// that was opened later.
class Queues {
  public:
    Queues();

    uint32_t open();
    // Null for a queue that was closed. A number that never was a handle is misuse, reported under the name
    // of the transport function.
    std::shared_ptr<Queue> find(const char* function, uint32_t handle) const;
    // The same, but a closed queue is misuse as well; never null.
    std::shared_ptr<Queue> get(const char* function, uint32_t handle) const;
    // Closes the queue and wakes its readers. A reader that waits in it keeps the object alive until it
    // returns.
    void close(uint32_t handle);

    // Gives the queue a host address that no other queue has, and returns it.
    Address bind(Queue& queue);
    // The queue that is bound to the address; null when there is none.
    Queue* at(const Address& host) const;

    size_t openCount() const { return queues_.size(); }

  private:
    std::map<uint32_t, std::shared_ptr<Queue>> queues_;
    uint32_t nextHandle_;
    uint16_t lastInstance_ = 0;
};

}  // namespace softboard

#endif
