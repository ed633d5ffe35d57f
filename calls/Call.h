// A call, which is one life of a call reference: what its messages have said about it so far.
#ifndef CALLS_CALL_H
#define CALLS_CALL_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "calls/Message.h"
#include "isdn/values.h"

namespace calls {

// A frame, and when it passed.
struct Moment {
    std::uint64_t frame = 0;  // its number in the input, from 1
    std::int64_t at = 0;      // nanoseconds on the D channel's clock; for durations
    capture::Clock clock = capture::Clock::none;
    std::int64_t time = 0;  // nanoseconds, as `clock` says; for people
    bool timed = false;     // whether the frame has a time or ticks; without them `at` says nothing
};
Moment momentOf(const Message& message);

enum class Kind : std::uint8_t {
    call,       // it has a B channel, as far as is known
    signalling  // a connection without a B channel, or a transaction (REGISTER)
};

enum class Phase : std::uint8_t { setUp, talking, clearing, held, ended };

enum class EndedBy : std::uint8_t {
    open,       // it has not ended in the trace
    release,    // RELEASE COMPLETE, crossing RELEASEs, RESUME REJECT, or STATUS with state 0
    restart,    // RESTART ACKNOWLEDGE for its channel
    link,       // the link was down for longer than T309
    replaced,   // its reference was used for a new call
    suspended,  // SUSPEND ACKNOWLEDGE
};

enum class ClearedBy : std::uint8_t { unknown, us, peer, both, nobody };

enum class Outcome : std::uint8_t {  // decided by the clearing's cause, unless a line says otherwise
    open,                            // it has not ended in the trace, and CONNECT was not seen
    answered,                        // CONNECT was seen
    busy,
    noAnswer,      // also: no terminal answered a SETUP to all
    abandoned,     // its origin cleared it before it was answered, with a cause that says nothing special
    rejected,      // cause 21
    number,        // the number is wrong, changed or incomplete
    incompatible,  // a bearer or service that is not to be had
    congestion,    // no channel, or a fault or an overload of the network
    protocol,      // causes 81 to 111
    other
};

std::string_view nameOf(Kind kind);
std::string_view nameOf(Phase phase);
std::string_view nameOf(EndedBy endedBy);
std::string_view nameOf(ClearedBy clearedBy);
std::string_view nameOf(Outcome outcome);

// What the trace lacks since a call's last message, so that it may have ended unseen.
enum class Lack : std::uint8_t { nothing, frames, board };

// A cause as a message of the call gave it.
struct CauseGiven {
    std::uint64_t frame = 0;
    std::uint8_t message = 0;  // the message type
    Side from = Side::us;
    capture::Role role = capture::Role::unknown;  // of the side that sent it
    std::uint8_t codingStandard = 0;
    std::uint8_t location = 0;
    std::uint8_t value = 0;
    std::vector<std::uint8_t> diagnostics;
    std::string words;  // "cause 17 user busy, remote user"
};

// A party's number as it was signalled.
struct Number {
    std::string digits;
    std::uint8_t type = 0;
    std::uint8_t plan = 0;
    std::optional<std::uint8_t> presentation;
};

struct Call {
    std::uint64_t number = 0;   // numbers the calls of all D channels from 1, in order of beginning
    std::uint64_t resumes = 0;  // the number of the suspended call that this call continues, or 0
    std::uint32_t group = 0;
    std::string file;
    std::string dChannel;
    Moment begin;
    Moment end;  // the message that ended it, or else the last one
    std::uint8_t tei = 0;
    std::uint64_t reference = 0;
    std::uint8_t referenceLength = 0;
    Side origin = Side::us;  // the side that chose the reference
    capture::Role originRole = capture::Role::unknown;
    Kind kind = Kind::call;
    Phase phase = Phase::setUp;

    Number calling;
    Number called;
    Number redirecting;
    Number connected;
    std::string bearer;  // in words: "speech", "64k unrestricted"
    std::optional<isdn::ChannelId> asked;
    std::optional<isdn::ChannelId> granted;  // of the first answer that names one
    std::optional<isdn::ChannelId> moved;    // of the latest RETRIEVE or RESUME ACKNOWLEDGE
    std::string askedWords;                  // the same in words: "30!", "any", "none", "0/30"
    std::string grantedWords;

    // Nanoseconds since `begin`; empty if there was no such message.
    std::optional<std::int64_t> firstResponse;
    std::optional<std::int64_t> progress;
    std::optional<std::int64_t> alerting;
    std::optional<std::int64_t> connect;
    std::optional<std::int64_t> lastDigit;  // of overlap sending
    std::optional<std::int64_t> duration;   // from CONNECT to the first clearing message

    Lack lack = Lack::nothing;
    bool incomplete = false;  // some of its messages may be missing in the trace
    EndedBy endedBy = EndedBy::open;
    ClearedBy clearedBy = ClearedBy::unknown;
    Outcome outcome = Outcome::open;
    bool clearingSeen = false;              // DISCONNECT, RELEASE or RELEASE COMPLETE has passed
    std::optional<CauseGiven> cause;        // of the first clearing message; empty if it has none
    std::optional<CauseGiven> causeBefore;  // of PROGRESS, or of a terminal that refused earlier
    std::vector<CauseGiven> laterCauses;    // of the clearing messages after the first, in order

    std::vector<std::uint64_t> frames;  // numbers; the first `mostFrames` of them
    std::uint64_t messages = 0;

    // What is special about it.
    bool beforeTrace = false;  // its SETUP is not in the trace
    bool uncertain = false;    // the board restarted meanwhile, or frames are missing
    bool setupRepeated = false;
    bool broadcast = false;
    bool overlap = false;
    bool gaveWay = false;   // glare: the other side's call on the same channel went on instead
    bool released = false;  // RELEASE has passed

    static constexpr std::size_t mostFrames = 1000;

    // The channel that the call got first, as far as is known: the one granted, or else the one asked for.
    const std::optional<isdn::ChannelId>& channel() const { return granted ? granted : asked; }
    // The channel that the call has now. It may come back from hold, or from suspension, on another channel.
    const std::optional<isdn::ChannelId>& held() const { return moved ? moved : channel(); }
};

// What is special about the call, as words with blanks between them: "before-trace setup-repeated".
std::string flagsOf(const Call& call);

// A time of the call, in nanoseconds; nothing if its frames have no times.
inline std::optional<std::int64_t> timeOf(const Call& call, const std::optional<std::int64_t>& nanoseconds) {
    return call.begin.timed ? nanoseconds : std::nullopt;
}

// Whether an engineer would say that the call failed. A call whose end is not in the trace has not failed.
bool hasFailed(const Call& call);
// Whether nobody answered it, for whatever reason.
bool isUnanswered(const Call& call);

}  // namespace calls

#endif
