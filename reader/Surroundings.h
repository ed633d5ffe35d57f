// What surrounds a trigger of one D channel, in files that stay when the others go.
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
    std::int64_t before = 0;  // nanoseconds that are kept of the time before a trigger
    std::int64_t after = 0;   // and after it
    RotationRules files;
};

// Holds the newest items in memory, no more than `mostItems` and `mostOctets` of them. Time is that of the
// items; when none come, the host's clock goes on.
class Surroundings {
  public:
    static constexpr std::size_t mostItems = 200'000;
    static constexpr std::size_t mostOctets = std::size_t{16} << 20;

    // References are kept.
    Surroundings(const SurroundingsRules& rules, const std::string& trunk, Chatter& chatter);

    // The interface and the file's name stay with whoever owns them.
    void take(const capture::Item& item);
    // Keeps what is held, and what comes in the time after. Again in that time: prolongs it. `why` is said,
    // and written down where the form has a place for comments.
    void trigger(const std::string& why);
    void flush();
    // Nothing has come since the last flush: the time after a trigger may be over.
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
    bool isCut_ = false;  // it was said that memory ends before `before`
    bool isOpen_ = false;
    std::int64_t until_ = 0;  // on the items' clock
    HostClock::time_point hostUntil_;
};

}  // namespace reader

#endif
