// A whole trace redacted, or restored, frame by frame: what a program uses that redacts.
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
// Only the octets change, never their number. Times, directions and ticks are not touched, and names of D
// channels and files are the caller's to hide.
//
// All frames of a trunk must pass, wanted or not, since digits of a number may come one by one: one redactor
// a trunk, kept as long as the trunk is recorded. After a new start numbers that go on are blanked.
//
// Memory is bounded. Used by one thread at a time; redactors of different threads share nothing.
class TraceRedactor {
  public:
    // `options` tell calls apart: timers, the role of our side, D channels that share their calls. Throws
    // KeyError if this host's libcrypto has no HMAC with SHA-512.
    TraceRedactor(const Key& key, Direction direction, const calls::Options& options = {});

    // Appends to `done` the frames that are ready by now, with their numbers: mostly this one. A SEGMENT
    // waits for the rest of its message, and the frames behind it do not, so frames may come out of their
    // order; a caller that keeps the order holds those behind it back. The interface must not be null.
    // Numbers grow.
    void take(const capture::Frame& frame, std::uint64_t number, isdn::Variant variant,
              std::vector<Rebuilt>& done);
    // A frame that was not recorded whole. It does not count in the trace.
    std::vector<std::uint8_t> cut(isdn::Octets frame, isdn::Variant variant);

    // What a recorder says between frames, as calls::Analysis takes it. Numbers whose digits may be missing
    // are blanked from here on.
    void mayMiss(const capture::Interface& interface, std::string_view reason);
    void mayLack(const capture::Interface& interface, calls::Side side);
    void restarted(const capture::Interface& interface);

    // Segments that wait are blanked and come out: at the end of a trace, or if nothing has come for
    // `longestWait`. take() does the same by itself once a segment has waited so long, or for `mostWaiting`
    // frames.
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
