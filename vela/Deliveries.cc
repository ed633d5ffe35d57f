#include "vela/Deliveries.h"

#include <utility>

namespace vela {

namespace {
thread_local const Deliveries::OnThisThread* innermost = nullptr;
}

void Deliveries::begin(const void* object) {
    const std::lock_guard guard(mutex_);
    if (object != nullptr)
        ++begun_[object];
    ++all_;
}

void Deliveries::end(const void* object) {
    const std::lock_guard guard(mutex_);
    if (const auto found = begun_.find(object); found != begun_.end() && --found->second == 0)
        begun_.erase(found);
    --all_;
    ended_.notify_all();
}

Deliveries::OnThisThread::OnThisThread(const Deliveries& all, const void* object)
    : all_(all), object_(object), outer_(std::exchange(innermost, this)) {}
Deliveries::OnThisThread::~OnThisThread() { innermost = outer_; }

// Waits until the only deliveries left are those that run on this thread.
template <typename Count, typename Concerns>
void Deliveries::awaitNone(Count count, Concerns concerns) {
    std::size_t own = 0;
    for (const OnThisThread* each = innermost; each != nullptr; each = each->outer_)
        own += &each->all_ == this && concerns(each->object_) ? 1 : 0;
    std::unique_lock guard(mutex_);
    ended_.wait(guard, [&] { return count() <= own; });
}

void Deliveries::awaitAll() {
    awaitNone([this] { return all_; }, [](const void*) { return true; });
}

void Deliveries::awaitFor(const void* object) {
    const auto count = [&] {
        const auto found = begun_.find(object);
        return found == begun_.end() ? 0 : found->second;
    };
    awaitNone(count, [object](const void* each) { return each == object; });
}

}  // namespace vela
