#include "reader/Primed.h"

namespace reader {

namespace {

constexpr std::chrono::milliseconds longestWait{500};

}  // namespace

bool Primed::awaitFirst(const std::atomic<bool>& stopped) {
    while (!held_) {
        if (stopped)
            return false;
        const Next next = reader_->next(first_);
        if (next == Next::pause)
            reader_->wait(longestWait);
        else
            held_ = next;
    }
    return true;
}

// The first item is still valid, because the reader was not asked for another one since.
capture::Reader::Next Primed::next(capture::Item& item) {
    if (!held_)
        return reader_->next(item);
    const Next next = *held_;
    held_.reset();
    if (next == Next::item)
        item = first_;
    return next;
}

}  // namespace reader
