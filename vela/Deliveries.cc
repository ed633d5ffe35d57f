#include "vela/Deliveries.h"

#include <algorithm>
#include <utility>

namespace vela {

namespace {
thread_local const Deliveries::Entry* own = nullptr;
}

Deliveries::Ticket Deliveries::begin(const void* object) {
    const std::lock_guard guard(mutex_);
    return running_.insert(running_.end(), Entry{object});
}

void Deliveries::end(Ticket ticket) {
    const std::lock_guard guard(mutex_);
    running_.erase(ticket);
    ended_.notify_all();
}

Deliveries::OnThisThread::OnThisThread(Ticket ticket) : outer_(std::exchange(own, &*ticket)) {}
Deliveries::OnThisThread::~OnThisThread() { own = outer_; }

template <typename Predicate>
void Deliveries::awaitNone(Predicate concerns) {
    std::unique_lock guard(mutex_);
    ended_.wait(guard, [&] {
        return std::none_of(running_.begin(), running_.end(),
                            [&](const Entry& entry) { return &entry != own && concerns(entry); });
    });
}

void Deliveries::awaitAll() {
    awaitNone([](const Entry&) { return true; });
}

void Deliveries::awaitFor(const void* object) {
    awaitNone([object](const Entry& entry) { return entry.object == object; });
}

}  // namespace vela
