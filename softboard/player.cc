#include "softboard/player.h"

#include "softboard/codes.h"

namespace softboard {

Player::Player(std::shared_ptr<const Frames> frames, Rate rate, bool loop)
    : frames_(std::move(frames)), rate_(rate), loop_(loop) {}

void Player::start(Time now) {
    if (playing_ || frames_->empty()) {
        return;
    }
    playing_ = true;
    started_ = last_ = now;
    position_ = 0;
    shown_ = roundStart_ = 0;
}

Player::Time Player::due() const {
    using std::chrono::duration_cast;
    switch (rate_.kind) {
        case Rate::Kind::recorded:
            return started_ + std::chrono::milliseconds(ticksOfNext() * millisecondsPerTick);
        case Rate::Kind::perSecond:
            return started_ + duration_cast<Time::duration>(std::chrono::duration<double>(
                                  static_cast<double>(shown_) / rate_.perSecond));
        default:
            return last_;
    }
}

Player::Shown Player::next(Time now) {
    const Shown shown{&(*frames_)[position_], static_cast<uint32_t>(ticksOfNext())};
    last_ = now;
    ++shown_;
    if (++position_ == frames_->size()) {
        roundStart_ += frames_->back().ticks + ticksBetweenRounds;
        position_ = 0;
        playing_ = loop_;
    }
    return shown;
}

}  // namespace softboard
