// Decides which frame of a D channel comes next, and when. A player has no thread and no clock: its caller
// tells it the time, and locks it.
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
        uint32_t ticks =
            0;  // the board's clock: 4 ms since the first frame, counted on through a loop's rounds
    };

    // How long a loop pauses between its rounds, at recorded rate.
    static constexpr uint32_t ticksBetweenRounds = 250;

    Player(std::shared_ptr<const Frames> frames, Rate rate, bool loop);

    // Begins with the first frame. Does nothing when the player is playing or has no frames.
    void start(Time now);
    void stop() { playing_ = false; }
    bool playing() const { return playing_; }

    // When the next frame is due. Call it only while playing.
    Time due() const;
    // Returns the next frame and moves on. After the last frame the player stops, unless it loops. Call it
    // only while playing.
    Shown next(Time now);

  private:
    uint64_t ticksOfNext() const { return roundStart_ + (*frames_)[position_].ticks; }

    std::shared_ptr<const Frames> frames_;
    Rate rate_;
    bool loop_;
    bool playing_ = false;
    Time started_;
    Time last_;                // when the frame before was taken
    size_t position_ = 0;      // of the next frame
    uint64_t shown_ = 0;       // frames since start()
    uint64_t roundStart_ = 0;  // in ticks since start()
};

}  // namespace softboard

#endif
