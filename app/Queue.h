// The records waiting to be shown.
#ifndef APP_QUEUE_H
#define APP_QUEUE_H

#include <memory>

#include "vela/CCS.h"

namespace vela {

// Bounded, first in first out. Never owns a record: that belongs to whoever holds its pointer. Not locked.
class Queue {
  public:
    explicit Queue(int capacity) : capacity_(capacity) {}
    Queue(const Queue&) = delete;
    Queue& operator=(const Queue&) = delete;
    ~Queue();

    // False when the queue is full or there is no memory.
    bool enqueue(CCS::EvtL2Trace_t* rec);
    // False when the queue is empty.
    bool dequeue(CCS::EvtL2Trace_t** out);

    bool isempty() const { return count_ == 0; }
    bool isfull() const { return count_ == capacity_; }
    int queuecount() const { return count_; }

  private:
    struct Node {
        CCS::EvtL2Trace_t* record;
        std::unique_ptr<Node> next;
    };

    std::unique_ptr<Node> head_;  // the oldest
    Node* tail_ = nullptr;
    int count_ = 0;
    int capacity_;
};

}  // namespace vela

#endif
