#include "app/Queue.h"

#include <new>
#include <utility>

namespace vela {

// One node at a time: letting the head go would recurse once a node.
Queue::~Queue() {
    while (head_ != nullptr)
        head_ = std::move(head_->next);
}

bool Queue::enqueue(CCS::EvtL2Trace_t* rec) {
    if (isfull())
        return false;
    std::unique_ptr<Node> node(new (std::nothrow) Node{rec, nullptr});
    if (node == nullptr)
        return false;
    ++count_;
    Node* const newest = node.get();
    (head_ == nullptr ? head_ : tail_->next) = std::move(node);
    tail_ = newest;
    return true;
}

bool Queue::dequeue(CCS::EvtL2Trace_t** out) {
    if (head_ == nullptr)
        return false;
    *out = head_->record;
    --count_;
    head_ = std::move(head_->next);
    if (count_ == 0)
        tail_ = nullptr;
    return true;
}

}  // namespace vela
