// The queue of records that wait to be written.
#ifndef APP_QUEUE_H
#define APP_QUEUE_H

#include <memory>

#include "vela/CCS.h"

namespace vela {

// First in, first out, with a limit. It does not own the records: whoever enqueues a record gives it to the
// thread that dequeues it. The class has no lock. It uses its nodes again, so it allocates memory only while
// more records wait than ever before.
class Queue {
  public:
    explicit Queue(int capacity) : capacity_(capacity) {}
    Queue(const Queue&) = delete;
    Queue& operator=(const Queue&) = delete;
    ~Queue();

    // Returns false when the queue is full or there is no memory.
    bool enqueue(CCS::EvtL2Trace_t* rec);
    // Sets *out to the oldest record. Returns false when the queue is empty.
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
    std::unique_ptr<Node> spares_;
    Node* tail_ = nullptr;
    int count_ = 0;
    int capacity_;
};

}  // namespace vela

#endif
