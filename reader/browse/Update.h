// What the thread that reads hands to the thread that shows, and the queue between them.
#ifndef READER_BROWSE_UPDATE_H
#define READER_BROWSE_UPDATE_H

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "calls/Call.h"
#include "calls/Finding.h"
#include "reader/browse/Page.h"
#include "reader/browse/Trunk.h"

namespace reader::browse {

// A frame of a call.
struct CallFrame {
    std::uint64_t call = 0;  // 0: RESTART or its answer, which may end any call
    std::uint64_t frame = 0;
    bool carried = false;  // a copy or a segment: it carries a message, which is heard by another frame
};

// Items that were read, and what they have changed.
struct Update {
    enum class State : std::uint8_t { reading, live, ended };

    std::shared_ptr<const Page> page = std::make_shared<Page>();
    std::map<std::uint64_t, calls::Call> calls{};  // new state of calls, by number; without Call::frames
    std::vector<CallFrame> frames{};
    std::vector<std::uint64_t> unwanted{};  // calls that do not pass the filters, as their end has shown
    std::vector<calls::Finding> findings{};
    std::vector<TrunkView> trunks{};  // empty: those of the update before stay
    std::uint64_t callsDropped = 0;   // how many calls were dropped because too many were alive
    std::uint64_t octets = 0;         // how far reading has come
    State state = State::reading;
    std::string error{};  // why reading ended early; empty otherwise
};

// Hands updates over in their order. put() waits while `most` updates are in the queue, so memory is bounded.
class UpdateQueue {
  public:
    // Thrown by put() once the queue is closed.
    class Closed {};

    // put() calls `wake` after it has added an update, on its own thread and without the lock.
    explicit UpdateQueue(std::function<void()> wake) : wake_(std::move(wake)) {}

    void put(Update update) {
        {
            std::unique_lock lock(mutex_);
            room_.wait(lock, [this] { return isClosed_ || held_.size() < most; });
            if (isClosed_)
                throw Closed();
            held_.push_back(std::move(update));
        }
        wake_();
    }
    // Takes the oldest update. Does not wait; returns nothing if there is none.
    std::optional<Update> take() {
        const std::lock_guard lock(mutex_);
        if (held_.empty())
            return std::nullopt;
        Update first = std::move(held_.front());
        held_.pop_front();
        room_.notify_one();
        return first;
    }
    // Wakes the thread that waits in put(). From now on put() throws.
    void close() {
        const std::lock_guard lock(mutex_);
        isClosed_ = true;
        room_.notify_all();
    }
    bool isClosed() const {
        const std::lock_guard lock(mutex_);
        return isClosed_;
    }

  private:
    static constexpr std::size_t most = 32;

    mutable std::mutex mutex_;  // guards what follows
    std::condition_variable room_;
    std::deque<Update> held_;
    bool isClosed_ = false;
    std::function<void()> wake_;
};

}  // namespace reader::browse

#endif
