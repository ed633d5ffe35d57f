// Redacts or restores a whole trace, frame by frame. Programs that redact use this class.
#ifndef REDACTION_TRACEREDACTOR_H
#define REDACTION_TRACEREDACTOR_H

#include <cstdint>
#include <memory>
#include <string_view>
#include <vector>

#include "calls/Analysis.h"
#include "redaction/Key.h"
#include "redaction/Pseudonyms.h"
#include "redaction/Redactor.h"

namespace redaction {

// Takes the frames of any number of D channels, each channel's in the order in which they passed, live or
// from a file:
//
//     const auto key = redaction::readKey("/etc/lapdmon/trunk.key");  // nothing: there is no such file
//     redaction::TraceRedactor redactor(*key, redaction::Direction::redact);
//     std::vector<redaction::Rebuilt> done;
//     redactor.take(frame, ++number, isdn::Variant::net5, done);
//
// Only the octets change, never their number. Times, directions and ticks stay. The caller hides names of D
// channels and files.
//
// Hand in all frames of a trunk, wanted or not, because digits of a number may come one by one. Keep one
// redactor for each trunk as long as the trunk is recorded: a new one blanks numbers whose first digits it
// has not seen.
//
// Memory is bounded. Used by one thread at a time; redactors of different threads share nothing.
class TraceRedactor {
  public:
    // `options` tell calls apart: timers, the role of our side, D channels that share their calls. Throws
    // KeyError if this host's libcrypto has no HMAC with SHA-512.
    TraceRedactor(const Key& key, Direction direction, const calls::Options& options = {});

    // Appends to `done` the frames that are ready now, with their numbers; in most cases this is the frame
    // itself. A SEGMENT waits for the rest of its message, and frames after it do not, so frames may leave in
    // another order; a caller that needs the order holds the later ones back. The interface must not be null.
    // `number` must be larger than in the call before.
    void take(const capture::Frame& frame, std::uint64_t number, isdn::Variant variant,
              std::vector<Rebuilt>& done);
    // Redacts a frame that was not recorded whole. Such a frame does not count in the trace.
    std::vector<std::uint8_t> cut(isdn::Octets frame, isdn::Variant variant);

    // What a recorder says between frames, as calls::Analysis takes it. Numbers whose digits may be missing
    // are blanked from here on.
    void mayMiss(const capture::Interface& interface, std::string_view reason);
    void mayLack(const capture::Interface& interface, calls::Side side);
    void restarted(const capture::Interface& interface);

    // Blanks all segments that wait, and appends their frames to `done`. Call it at the end of a trace, or if
    // nothing has come for `longestWait`. take() does the same when a segment has waited for that time or for
    // `mostWaiting` frames.
    void giveUp(std::vector<Rebuilt>& done) { redactor_.giveUpSegments(done); }
    bool isWaiting() const { return redactor_.isWaiting(); }

    // The next segment has to follow within T314, 4 s (Q.931 annex H). In nanoseconds of the frames' clock.
    static constexpr std::int64_t longestWait = 10'000'000'000;
    static constexpr std::uint64_t mostWaiting = 4096;

  private:
    std::unique_ptr<Pseudonyms> pseudonyms_;
    Redactor redactor_;
    calls::Analysis analysis_;
};

}  // namespace redaction

#endif
