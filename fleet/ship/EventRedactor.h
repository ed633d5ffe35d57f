// Puts pseudonyms in place of numbers before anything leaves the host.
#ifndef FLEET_SHIP_EVENTREDACTOR_H
#define FLEET_SHIP_EVENTREDACTOR_H

#include <chrono>
#include <cstdint>
#include <deque>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "fleet/ship/TrunkInput.h"
#include "redaction/TraceRedactor.h"

namespace fleet {

// Of one D channel. Keeps the order: what stands behind a piece of a message waits with it until the message
// is whole. Comments are left out, and what else the recorder said is put in words of our own, since both may
// name people.
class EventRedactor {
  public:
    using Next = std::function<void(const InputEvent&)>;

    // `next` gets the events, with views that are valid during the call.
    EventRedactor(const redaction::Key& key, Next next);

    // Old events must pass as well: numbers may begin in them.
    void take(const InputEvent& event);
    // Nothing more is there just now. What has waited too long goes on, with its pieces blanked.
    void pause();

  private:
    using Clock = std::chrono::steady_clock;

    struct Waiting {
        InputEvent event;
        capture::Interface interface;
        std::vector<std::uint8_t> octets;
        std::uint64_t token = 0;
        bool isReady = false;
    };

    void redact(Waiting& waiting);
    void settle(const std::vector<redaction::Rebuilt>& done);
    void release();
    void giveUp();

    redaction::Key key_;
    Next next_;
    std::optional<redaction::TraceRedactor> redactor_;  // of the run
    std::uint64_t run_ = 0;
    std::uint64_t frames_ = 0;
    std::deque<Waiting> waiting_;
    Clock::time_point newest_{};
};

}  // namespace fleet

#endif
