// One D channel on its way from its recordings to the stream.
#ifndef FLEET_SHIP_SHIPPEDTRUNK_H
#define FLEET_SHIP_SHIPPEDTRUNK_H

#include <array>
#include <chrono>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <optional>
#include <string>

#include "fleet/ship/EventRedactor.h"
#include "fleet/ship/Outbox.h"
#include "fleet/ship/Packer.h"
#include "fleet/ship/Place.h"
#include "fleet/ship/ShipConfig.h"
#include "fleet/ship/TrunkInput.h"

namespace fleet {

// Says a line to whoever runs the program.
using Say = std::function<void(const std::string&)>;

class ShippedTrunk {
  public:
    using Clock = std::chrono::steady_clock;

    // `number` is the D channel's number in the outbox. Reads the place; if the file is damaged, says so and
    // ships everything again. With a key, pseudonyms are shipped in place of numbers.
    ShippedTrunk(const ShippedDChannel& dChannel, std::size_t number, const std::string& stateFolder,
                 const redaction::Key* key, Say say);
    ShippedTrunk(const ShippedTrunk&) = delete;
    ShippedTrunk& operator=(const ShippedTrunk&) = delete;

    // Reads some frames and puts them into the outbox. Returns false if there is nothing more to read just
    // now, or if the outbox has no room.
    bool step(Outbox& outbox);
    // The outbox says that everything up to here is safe. The place moves there when settle() is called for
    // that time. A log or a FIFO cannot be read again, so its place moves at once.
    void safe(const SafeUpTo& upTo, Clock::time_point now);
    // What was safe at this time stays safe, whatever happens to the server.
    void settle(Clock::time_point then);
    // Begins at the place again, and takes what was read behind it out of the outbox. Returns false if the
    // input cannot be read again; then nothing happens.
    bool goBack(Outbox& outbox);
    // Whether the first event of a new run waits until everything that was sent before it is safe.
    bool isHolding() const { return isHeld_; }
    // Writes the place to its file if it has changed. Returns false if that fails, and says so once.
    bool save();

    const std::string& name() const { return name_; }
    std::uint64_t frames() const { return frames_; }
    // When the newest frame that our side has sent, or received, was recorded, in nanoseconds since 1970; 0
    // if none was read. What is read a second time does not count again.
    std::int64_t newest(bool transmitted) const { return newest_[transmitted ? 1 : 0]; }
    std::uint64_t gaps() const { return gaps_; }

  private:
    struct Safe {
        SafeUpTo upTo;
        Clock::time_point since;
    };

    void begin();
    bool readNext();
    void count(const InputEvent& event);
    void moveTo(const SafeUpTo& upTo);
    bool beginRun(Outbox& outbox);
    void take(const InputEvent& event);
    void sayOnce(const std::string& text);

    ShippedDChannel dChannel_;
    std::size_t number_;
    std::optional<redaction::Key> key_;
    std::string name_;
    std::string placePath_;
    Say say_;
    std::string said_;
    Place place_;
    std::deque<Safe> safe_;  // what the place has not reached yet
    bool isChanged_ = false;
    bool makesRuns_;  // it reads a log, and no recorder numbers its runs
    std::unique_ptr<TrunkInput> input_;
    Packer packer_;
    std::optional<EventRedactor> redactor_;  // hands on to the packer
    InputEvent event_;
    bool isHeld_ = false;  // the event begins a run that is not written down yet
    std::uint64_t run_;    // of the newest event
    std::pair<std::uint64_t, std::uint64_t>
        counted_;  // run and number of the furthest event that was counted
    std::uint64_t frames_ = 0;
    std::uint64_t gaps_ = 0;
    std::array<std::int64_t, 2> newest_{};
};

}  // namespace fleet

#endif
