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
        message,  // a message of the call
        link,     // a frame that sets the link up, ends it, or asks for frames again
        words     // no frame: what the recorder says, or a new day
    };

    Kind kind = Kind::message;
    std::uint64_t frame = 0;  // the frame's number; for words, the number of the frame before them
    Instant when;
    std::int64_t at = 0;  // nanoseconds on the D channel's clock, for durations
    calls::Side from = calls::Side::us;
    std::uint8_t tei = 0;
    std::string dChannel;
    std::string name;                  // "SETUP", "SABME"; for words, the whole text
    std::vector<std::string> details;  // "channel 1?", "cause 16 normal clearing, remote user"
};

// Texts may contain any characters that frames contain; the code that prints them must make them harmless.
struct CallLadder {
    std::vector<std::string> headline;  // the call as the command `calls` shows it, a field an entry
    std::string us;                     // what stands above the life lines: "us (user)"
    std::string peer;
    std::vector<Rung> rungs;      // in the order of the input
    std::uint64_t missing = 0;    // how many messages were left out because there were too many
    bool hasSeveralTeis = false;  // the call has several terminals, so each rung names its own
    bool namesDChannels = false;  // each rung names its D channel, since the messages passed on several

    // Nanoseconds since the rung before; nothing for the first one.
    std::optional<std::int64_t> sinceBefore(std::size_t rung) const;
};

// "08:00:01.300" of a date, "1.300" of a time that is no date, empty without a time.
std::string timeOfDay(Instant when, TimeText& times);

// The details of a rung, and in front of them its D channel ("on pri1") and its terminal ("TEI 67") where the
// ladder has several.
std::vector<std::string> detailsOf(const CallLadder& ladder, const Rung& rung);

// Several calls as one ladder, in the order of their frames; each rung of a message says which call it is of.
// `calls` are their numbers. One ladder alone stays as it is.
CallLadder together(std::vector<CallLadder> ladders, const std::vector<std::uint64_t>& calls);

// Collects the rungs of the calls that are alive, and the events of links. Memory is bounded.
class Ladders {
  public:
    // How many rungs are kept. Of one call the first ones are kept; if all calls have too many together,
    // those of the oldest calls are dropped; of the links the last ones are kept.
    static constexpr std::size_t mostOfACall = 1000;
    static constexpr std::size_t mostInAll = 100'000;
    static constexpr std::size_t mostOfLinks = 10'000;

    // To be called for each item, before the analysis takes it.
    void see(const Seen& seen);
    // Adds a message of the call.
    void heard(const calls::Message& message, const calls::Call& call);
    // Adds a frame that carried a message of the call without being the one by which it was heard.
    void carried(const calls::Message& message, const calls::Call& call);
    // Keeps a RESTART or its answer with the events of links, because it may end calls.
    void restarted(const calls::Message& message);
    // Returns the ladder of a call that has gone, with what happened to its links meanwhile, and forgets the
    // call. The headline names the call's D channel if there are several.
    CallLadder take(const calls::Call& call, TimeText& times, bool severalDChannels = false);
    void forget(const calls::Call& call);

  private:
    struct OfCall {
        std::vector<Rung> rungs;
        std::uint64_t heard = 0;  // how many of them are messages
    };

    Rung rungOf(const calls::Message& message) const;
    bool add(const calls::Call& call, Rung rung);
    void addLinkRungs(const calls::Call& call, std::vector<Rung>& rungs) const;

    std::map<std::uint64_t, OfCall> calls_;  // by number of the call, so that the oldest call is the first
    std::size_t count_ = 0;                  // how many rungs all calls have together
    std::deque<Rung> links_;
    // Describe the item that was seen last.
    std::uint64_t number_ = 0;
    capture::Frame frame_;
    Instant when_;
    std::int64_t at_ = 0;
};

}  // namespace reader

#endif
