// Which frame of a D channel comes next, and when. No thread and no clock of its own.
#ifndef SOFTBOARD_PLAYER_H
#define SOFTBOARD_PLAYER_H

#include <chrono>
#include <cstdint>
#include <memory>

#include "softboard/scenario.h"

namespace softboard {

class Player {
  public:
    using Time = std::chrono::steady_clock::time_point;

    struct Shown {
        const Frame* frame = nullptr;
        uint32_t ticks = 0;  // the board's clock: from the first frame on, through all rounds of a loop
    };

    // Time between the last frame of a round and the first of the next, at recorded rate.
    static constexpr uint32_t ticksBetweenRounds = 250;

    Player(std::shared_ptr<const Frames> frames, Rate rate, bool loop);

    // From the first frame; nothing when it plays already.
    void start(Time now);
    void stop() { playing_ = false; }
    bool playing() const { return playing_; }

    // When the next frame is due. While playing only.
    Time due() const;
    // The next frame; after the last one of all the player has stopped.
    Shown next(Time now);

  private:
    uint64_t ticksOfNext() const { return roundStart_ + (*frames_)[position_].ticks; }

    std::shared_ptr<const Frames> frames_;
    Rate rate_;
    bool loop_;
    bool playing_ = false;
    Time started_;
    Time last_;
    size_t position_ = 0;
    uint64_t shown_ = 0;
    uint64_t roundStart_ = 0;  // in ticks
};

}  // namespace softboard

#endif
