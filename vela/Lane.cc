#include "vela/Lane.h"

#include <utility>

#include "vela/report.h"

namespace vela {

std::unique_ptr<Delivery> Lane::spare() {
    const Lock lock(mutex_);
    if (spares_ == nullptr)
        return std::make_unique<Delivery>();
    std::unique_ptr<Delivery> taken = std::move(spares_);
    spares_ = std::move(taken->next);
    --spareCount_;
    return taken;
}

void Lane::keep(std::unique_ptr<Delivery> delivery) {
    if (spareCount_ == bounds_.atWork)
        return;
    ++spareCount_;
    delivery->next = std::move(spares_);
    spares_ = std::move(delivery);
}

void Lane::add(std::unique_ptr<Delivery> delivery) {
    const std::size_t octets = delivery->octets();
    Lock lock(mutex_);
    if (closed_)
        return;
    if ((!waiting_.empty() || !mayStart()) && !hasRoomFor(octets)) {
        refuse(lock);
        return;
    }
    try {
        waiting_.push_back({std::move(delivery), octets});
    } catch (...) {
        ++losses_.noMeans;
        ++missing_;
        throw;
    }
    octets_ += octets;
    waiting_.back().delivery->missing = std::exchange(missing_, 0);
    // If others wait already, it gets its thread when a delivery that is at work ends.
    if (waiting_.size() == 1)
        startWaiting(lock);
}

void Lane::refuse(Lock& lock) {
    ++losses_.noRoom;
    ++missing_;
    const bool first = unsaid_++ == 0;
    lock.unlock();
    if (first)
        full();
}

void Lane::runHere(std::unique_ptr<Delivery> delivery) {
    {
        const Lock lock(mutex_);
        delivery->missing = std::exchange(missing_, 0);
        number(*delivery);
    }
    delivery->run();
}

void Lane::lose() {
    const Lock lock(mutex_);
    ++losses_.noMeans;
    ++missing_;
}

void Lane::number(Delivery& delivery) {
    ++started_;
    if (delivery.body != nullptr)
        delivery.body->setArrival({started_, delivery.missing});
}

// Gives threads to deliveries that wait, as long as more may be at work. Only one thread at a time does so,
// so that numbers are in the order of arrival, and the number of a delivery whose thread was refused is used
// again. After each new thread it looks again, so that it notices what has become possible meanwhile.
void Lane::startWaiting(Lock& lock) {
    if (starting_)
        return;
    starting_ = true;
    while (!waiting_.empty() && mayStart()) {
        std::unique_ptr<Delivery> next = takeFirst();
        ++atWork_;
        number(*next);
        lock.unlock();
        try {
            next->errand = {&Lane::runOnThread, nullptr, nullptr, next.get()};
            AbandonedThread_create(next->errand, next->stackSize);
        } catch (...) {
            lock.lock();
            noThreadFor(*next);
            starting_ = false;
            throw;
        }
        static_cast<void>(next.release());  // the thread owns it now
        lock.lock();
    }
    starting_ = false;
}

std::unique_ptr<Delivery> Lane::takeFirst() {
    octets_ -= waiting_.front().octets;
    std::unique_ptr<Delivery> first = std::move(waiting_.front().delivery);
    waiting_.pop_front();
    return first;
}

// The system has refused the delivery's thread. The next delivery gets its number, and tells that it is
// missing.
void Lane::noThreadFor(const Delivery& delivery) {
    --atWork_;
    --started_;
    ++losses_.noMeans;
    (waiting_.empty() ? missing_ : waiting_.front().delivery->missing) += delivery.missing + 1;
}

// Does what startWaiting does, and reports a refusal, because no caller handles it. The deliveries that wait
// go on waiting while others are at work: this function is called when one of those ends.
void Lane::startMore(Lock& lock) {
    bool refused = false;
    do {
        refused = false;
        try {
            startWaiting(lock);
        } catch (...) {
            refused = true;
            lock.unlock();
            reportInternalError();
            lock.lock();
        }
    } while (refused && !waiting_.empty() && atWork_ + alsoAtWork() == 0);
}

void* Lane::runOnThread(Thread::control*, void* arg) {
    const struct Running {
        Delivery* delivery;
        std::shared_ptr<Lane> lane = delivery->lane;

        ~Running() {
            delivery->end();
            lane->ended(std::unique_ptr<Delivery>(delivery));
        }
    } running{static_cast<Delivery*>(arg)};
    running.delivery->run();
    return nullptr;
}

void Lane::ended(std::unique_ptr<Delivery> delivery) {
    Lock lock(mutex_);
    --atWork_;
    keep(std::move(delivery));
    startMore(lock);
    sayWhatWasLost(lock);
}

void Lane::resume() {
    Lock lock(mutex_);
    startMore(lock);
}

void Lane::sayWhatWasLost(Lock& lock) {
    if (unsaid_ == 0 || !waiting_.empty())
        return;
    const std::uint64_t lost = std::exchange(unsaid_, 0);
    lock.unlock();
    sayLost(lost);
}

void Lane::sayLost(std::uint64_t deliveries) {
    report(joined("too many deliveries waited, lost: ", deliveries));
}

void Lane::close() {
    const Lock lock(mutex_);
    closed_ = true;
}

bool Lane::isClosed() const {
    const Lock lock(mutex_);
    return closed_;
}

std::uint64_t Lane::discardWaiting() {
    std::deque<Waiting> gone;  // destroyed after the lock has been given back
    const Lock lock(mutex_);
    gone.swap(waiting_);
    octets_ = 0;
    for (const Waiting& each : gone)
        missing_ += each.delivery->missing;
    return gone.size();
}

std::uint64_t Lane::waiting() const {
    const Lock lock(mutex_);
    return waiting_.size();
}

std::uint64_t Lane::pending() const {
    const Lock lock(mutex_);
    return waiting_.size() + atWork_;
}

std::uint64_t Lane::started() const {
    const Lock lock(mutex_);
    return started_;
}

std::uint64_t Lane::missing() const {
    const Lock lock(mutex_);
    return missing_;
}

Lane::Losses Lane::losses() const {
    const Lock lock(mutex_);
    return losses_;
}

}  // namespace vela
