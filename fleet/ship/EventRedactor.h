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

// Redacts the events of one D channel and keeps their order. A SEGMENT waits until its message is whole, and
// all events after it wait as well. Comments are dropped, and texts of what else the recorder said are
// replaced by our own words, because both may name people.
class EventRedactor {
  public:
    using Next = std::function<void(const InputEvent&)>;

    // `next` gets the redacted events; their views are valid only during the call.
    EventRedactor(const redaction::Key& key, Next next);

    // Takes an event. Old events must be taken as well, because a number's first digits may be in them.
    void take(const InputEvent& event);
    // The caller has no event just now. If none has come for TraceRedactor::longestWait, gives the events
    // that wait, with their segments blanked.
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
