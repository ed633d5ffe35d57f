// Keeps what surrounds the triggers of one D channel, in files that stay when other recordings are removed.
#ifndef READER_SURROUNDINGS_H
#define READER_SURROUNDINGS_H

#include <chrono>
#include <cstdint>
#include <deque>
#include <string>

#include "capture/Item.h"
#include "reader/Chatter.h"
#include "reader/HeldItem.h"
#include "reader/RotatingFile.h"

namespace reader {

struct SurroundingsRules {
    std::int64_t before = 0;  // how much of the time before a trigger is kept, in nanoseconds
    std::int64_t after = 0;   // how much of the time after it
    RotationRules files;
};

// Holds the newest items in memory, at most `mostItems` items and `mostOctets` octets. Time is the time of
// the items; while none come, the host's clock is used.
class Surroundings {
  public:
    static constexpr std::size_t mostItems = 200'000;
    static constexpr std::size_t mostOctets = std::size_t{16} << 20;

    // Keeps references to its arguments.
    Surroundings(const SurroundingsRules& rules, const std::string& trunk, Chatter& chatter);

    // Takes an item. Its interface and its file's name must outlive this object.
    void take(const capture::Item& item);
    // Writes the items that are held, and those that come in the time after. A further trigger in that time
    // prolongs it. `why` is told to the user, and written to the file if its form has comments.
    void trigger(const std::string& why);
    void flush();
    // Nothing has come since the last flush. Ends the file if the time after the trigger is over.
    void idle();
    // Ends a file that is open.
    void finish();

  private:
    using HostClock = std::chrono::steady_clock;

    void hold(const capture::Item& item);
    bool beginsTooEarly() const;
    void dropOldest();
    void comment(const std::string& why, const capture::Item& at);

    const SurroundingsRules& rules_;
    std::string trunk_;
    Chatter& chatter_;
    RotatingFile file_;
    std::deque<HeldItem> held_;
    std::int64_t newest_ = 0;  // time of the newest item that has one
    std::size_t octets_ = 0;
    bool isCut_ = false;  // the user was told that memory does not suffice for `before`
    bool isOpen_ = false;
    std::int64_t until_ = 0;  // on the items' clock
    HostClock::time_point hostUntil_;
};

}  // namespace reader

#endif
