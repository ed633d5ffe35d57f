#include "reader/Crew.h"

#include <algorithm>
#include <utility>

namespace reader {

Crew::Crew(std::vector<Job> jobs) : own_(std::move(jobs.front())) {
    for (std::size_t i = 1; i < jobs.size(); ++i)
        threads_.emplace_back([this, job = std::move(jobs[i])] { serve(job); });
}

Crew::~Crew() {
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true;
    }
    handedIn_.notify_all();
    for (std::thread& thread : threads_)
        thread.join();
}

Crew::Entry* Crew::claim() {
    const auto waiting = std::find_if(entries_.begin(), entries_.end(),
                                      [](const Entry& entry) { return entry.state == State::waiting; });
    if (waiting == entries_.end())
        return nullptr;
    waiting->state = State::working;
    return &*waiting;
}

// The caller holds the lock; it is released during the work and held again on return.
void Crew::workOn(Entry& entry, const Job& job, std::unique_lock<std::mutex>& lock) {
    lock.unlock();
    std::exception_ptr thrown;
    try {
        job(*entry.chunk);
    } catch (...) {
        thrown = std::current_exception();
    }
    lock.lock();
    entry.thrown = thrown;
    entry.state = State::done;
    finished_.notify_one();
}

void Crew::serve(const Job& job) {
    std::unique_lock lock(mutex_);
    while (true) {
        Entry* entry = nullptr;
        handedIn_.wait(lock, [&] { return stopping_ || (entry = claim()) != nullptr; });
        if (entry == nullptr)
            return;
        workOn(*entry, job, lock);
    }
}

void Crew::handIn(std::unique_ptr<Chunk> chunk) {
    {
        const std::lock_guard lock(mutex_);
        entries_.push_back({std::move(chunk), State::waiting, nullptr});
    }
    handedIn_.notify_one();
}

std::unique_ptr<Chunk> Crew::takeBack() {
    std::unique_lock lock(mutex_);
    if (entries_.empty())
        return nullptr;
    // The owner does work that no thread has begun, and waits only if there is none.
    while (entries_.front().state != State::done) {
        if (Entry* entry = claim(); entry != nullptr)
            workOn(*entry, own_, lock);
        else
            finished_.wait(lock, [&] { return entries_.front().state == State::done; });
    }
    Entry entry = std::move(entries_.front());
    entries_.pop_front();
    if (entry.thrown)
        std::rethrow_exception(entry.thrown);
    return std::move(entry.chunk);
}

}  // namespace reader
