#include "app/Queue.h"

#include <new>
#include <utility>

namespace vela {

// Deletes one node at a time, because deleting the head would delete the others recursively.
Queue::~Queue() {
    for (std::unique_ptr<Node>* list : {&head_, &spares_}) {
        while (*list != nullptr)
            *list = std::move((*list)->next);
    }
}

bool Queue::enqueue(CCS::EvtL2Trace_t* rec) {
    if (isfull())
        return false;
    std::unique_ptr<Node> node = std::move(spares_);
    if (node != nullptr)
        spares_ = std::move(node->next);
    else if (node.reset(new (std::nothrow) Node{}); node == nullptr)
        return false;
    node->record = rec;
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
    std::unique_ptr<Node> emptied = std::move(head_);
    head_ = std::move(emptied->next);
    if (count_ == 0)
        tail_ = nullptr;
    emptied->next = std::move(spares_);
    spares_ = std::move(emptied);
    return true;
}

}  // namespace vela
