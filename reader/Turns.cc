#include "reader/Turns.h"

namespace reader {

std::optional<Turns::Turn> Turns::beginReading(bool isOwner) {
    std::unique_lock lock(mutex_);
    (isOwner ? ownerMayRead_ : othersMayRead_).wait(lock, [&] {
        return isClosed_ || (!isReading_ && (isOwner || !isOwnersNext_));
    });
    if (isClosed_)
        return std::nullopt;
    isReading_ = true;
    isOwnersNext_ = false;
    return ++last_;
}

void Turns::endReading(bool isOwnersNext) {
    {
        const std::lock_guard lock(mutex_);
        isReading_ = false;
        isOwnersNext_ = isOwnersNext;
    }
    ownerMayRead_.notify_one();
    if (!isOwnersNext)
        othersMayRead_.notify_one();
}

void Turns::await(Turn turn) {
    std::unique_lock lock(mutex_);
    turnHasCome_[turn % turnHasCome_.size()].wait(lock, [&] { return ended_ + 1 == turn; });
}

void Turns::end() {
    std::size_t next = 0;
    {
        const std::lock_guard lock(mutex_);
        ++ended_;
        next = (ended_ + 1) % turnHasCome_.size();
    }
    turnHasCome_[next].notify_one();
}

void Turns::close() {
    {
        const std::lock_guard lock(mutex_);
        isClosed_ = true;
    }
    ownerMayRead_.notify_all();
    othersMayRead_.notify_all();
}

}  // namespace reader
