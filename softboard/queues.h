// The host's message queues. Not locked: the network that owns them is.
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
    std::deque<NvMsg32Bit*> waiting;  // owned by the library
    std::condition_variable arrived;  // a message, or the close
};

// Handles are never used twice, so that a call on a closed queue is told from one on a queue of somebody
// else.
class Queues {
  public:
    Queues();

    uint32_t open();
    // Null for a queue that was closed; a handle that never was one is misuse.
    std::shared_ptr<Queue> find(const char* function, uint32_t handle) const;
    // As find, and a closed queue is misuse too.
    std::shared_ptr<Queue> get(const char* function, uint32_t handle) const;
    // The queue ends; a reader that waits in it still holds it.
    void close(uint32_t handle);

    // A host address that no other queue has.
    Address bind(Queue& queue);
    // The queue that receives at the address; null when there is none.
    Queue* at(const Address& host) const;

    size_t openCount() const { return queues_.size(); }

  private:
    std::map<uint32_t, std::shared_ptr<Queue>> queues_;
    uint32_t nextHandle_;
    uint16_t lastInstance_ = 0;
};

}  // namespace softboard

#endif
