// What the thread that reads hands to the one that shows.
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
    bool carried = false;  // it carries a message without being the one that counts
};

// A piece of news: items, and what they have changed.
struct Update {
    enum class State : std::uint8_t { reading, live, ended };

    std::shared_ptr<const Page> page = std::make_shared<Page>();
    std::map<std::uint64_t, calls::Call> calls{};  // as they stand now, by number; without `frames`
    std::vector<CallFrame> frames{};
    std::vector<std::uint64_t> unwanted{};  // calls that the filters hide after all
    std::vector<calls::Finding> findings{};
    std::vector<TrunkView> trunks{};  // empty: as before
    std::uint64_t callsDropped = 0;   // since too many were alive
    std::uint64_t octets = 0;         // how far reading has come
    State state = State::reading;
    std::string error{};  // reading ended with it
};

// Hands updates over in their order. Whoever puts waits while much is held: memory is bounded.
class UpdateQueue {
  public:
    // Thrown where nobody takes any more.
    class Closed {};

    // `wake` is called after each put, on the thread that puts.
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
    // Does not wait; empty if there is none.
    std::optional<Update> take() {
        const std::lock_guard lock(mutex_);
        if (held_.empty())
            return std::nullopt;
        Update first = std::move(held_.front());
        held_.pop_front();
        room_.notify_one();
        return first;
    }
    // Nothing is taken any more.
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
