// A call as a ladder: its messages between our side and the other one, and what happened to the link between
// them. Printers make text, SVG or Mermaid of it.
#ifndef READER_CALLLADDER_H
#define READER_CALLLADDER_H

#include <cstdint>
#include <deque>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "calls/Analysis.h"
#include "reader/Seen.h"

namespace reader {

// One arrow, or one line of words.
struct Rung {
    enum class Kind : std::uint8_t {
        message,  // of the call
        link,     // a frame that sets the link up, ends it, or asks for frames again
        words     // no frame: what the recorder says, or a new day
    };

    Kind kind = Kind::message;
    std::uint64_t frame = 0;  // its number; of words that of the frame before them
    Instant when;
    std::int64_t at = 0;  // nanoseconds on the D channel's clock, for durations
    calls::Side from = calls::Side::us;
    std::uint8_t tei = 0;
    std::string dChannel;
    std::string name;                  // "SETUP", "SABME"; of words all there is to say
    std::vector<std::string> details;  // "channel 1?", "cause 16 normal clearing, remote user"
};

// Texts may hold what the frames hold: whoever prints them makes them harmless.
struct CallLadder {
    std::vector<std::string> headline;  // as `calls` has it, a word or a few each
    std::string us;                     // what stands above the life lines: "us (user)"
    std::string peer;
    std::vector<Rung> rungs;      // in the order of the input
    std::uint64_t missing = 0;    // messages that are not among them, since there were too many
    bool hasSeveralTeis = false;  // the terminal of a rung is worth a word

    // Nanoseconds since the rung before; nothing for the first one.
    std::optional<std::int64_t> sinceBefore(std::size_t rung) const;
};

// "08:00:01.300" of a date, "1.300" of a time that is no date, empty without a time.
std::string timeOfDay(Instant when, TimeText& times);

// The details, with what the ladder as a whole makes worth a word: "TEI 67".
std::vector<std::string> detailsOf(const CallLadder& ladder, const Rung& rung);

// Collects the rungs of the calls that are alive, and what happens to links. Memory is bounded.
class Ladders {
  public:
    // What is kept: of one call the first ones; of all calls together all but the oldest calls'; of all links
    // the last ones.
    static constexpr std::size_t mostOfACall = 1000;
    static constexpr std::size_t mostInAll = 100'000;
    static constexpr std::size_t mostOfLinks = 10'000;

    // Each item, before the analysis takes it.
    void see(const Seen& seen);
    // A message of the call.
    void heard(const calls::Message& message, const calls::Call& call);
    // A frame that carried a message of the call without being the one that counts.
    void carried(const calls::Message& message, const calls::Call& call);
    // RESTART or its answer: it may end calls.
    void restarted(const calls::Message& message);
    // The call has gone: its ladder, with what happened to its links meanwhile. Nothing is kept of it.
    CallLadder take(const calls::Call& call, TimeText& times);
    void forget(const calls::Call& call);

  private:
    struct OfCall {
        std::vector<Rung> rungs;
        std::uint64_t heard = 0;  // how many of them are messages
    };

    Rung rungOf(const calls::Message& message) const;
    bool add(const calls::Call& call, Rung rung);
    void addLinkRungs(const calls::Call& call, std::vector<Rung>& rungs) const;

    std::map<std::uint64_t, OfCall> calls_;  // by number, so that the oldest is the first
    std::size_t count_ = 0;                  // of their rungs
    std::deque<Rung> links_;
    // Of the item that was seen last.
    std::uint64_t number_ = 0;
    capture::Frame frame_;
    Instant when_;
    std::int64_t at_ = 0;
};

}  // namespace reader

#endif
