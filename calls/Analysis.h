// Everything about calls, from frames: which call a frame belongs to, the calls themselves, and findings.
#ifndef CALLS_ANALYSIS_H
#define CALLS_ANALYSIS_H

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "calls/Call.h"
#include "calls/CallTable.h"
#include "calls/DChannel.h"
#include "calls/Finding.h"
#include "calls/Timers.h"
#include "capture/Frame.h"
#include "isdn/Variant.h"

namespace calls {

// Told of results, in the order in which they are certain.
class Listener {
  public:
    Listener() = default;
    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;
    virtual ~Listener() = default;

    // A message that the receiver's layer 2 has accepted, put together if it came in segments. `call` is null
    // if it belongs to none. The number of the frame may be lower than that of the frame handed in last.
    virtual void heard(const Message& /*message*/, const Call* /*call*/) {}
    // A frame that carries a message without being the one by which it is heard: a copy that the receiver's
    // layer 2 does not hand up, or a segment. `call` is null if it belongs to none. It may come up to ten
    // seconds of the trace late. Every frame of call control that carries a message comes either here or in
    // `heard`; only one that stood behind a hole for longer than that may come here first and there later.
    virtual void carried(const Message& /*message*/, const Call* /*call*/) {}
    // The call has ended; stragglers may still be heard. Nothing is said of a call that outlives the trace.
    virtual void ended(const Call& /*call*/) {}
    // Nothing will change in the call any more. Calls that share a table come in the order of their end.
    virtual void gone(const Call& /*call*/) {}
    virtual void found(const Finding& /*finding*/) {}
};

// How long a D channel was heard, on its clock, in nanoseconds.
struct Span {
    std::string dChannel;
    std::uint32_t group = 0;  // as in Call
    std::int64_t from = 0;
    std::int64_t until = 0;
};

struct Options {
    Timers timers;
    capture::Role role = capture::Role::unknown;   // of our side, if it is given from outside
    isdn::Variant variant = isdn::Variant::net5;   // of D channels whose own is not known
    std::vector<std::vector<std::string>> groups;  // names of D channels that share their calls (NFAS)
};

// Takes the frames of any number of D channels. Memory is bounded whatever the frames are. Used by one thread
// at a time.
class Analysis {
  public:
    Analysis(const Options& options, Listener& listener);
    ~Analysis();
    Analysis(const Analysis&) = delete;
    Analysis& operator=(const Analysis&) = delete;

    // `number` counts the frames of the input from 1. The frame's interface must not be null. The result is
    // that of the frame's link and valid until the next call.
    const Marks& take(const capture::Frame& frame, std::uint64_t number);
    // The recorder may have missed frames of this D channel; `reason` says why and is a literal.
    void mayMiss(const capture::Interface& interface, std::string_view reason);
    // It has seen a frame without its octets.
    void mayLack(const capture::Interface& interface, Side side);
    // The recorder or the board was started again.
    void restarted(const capture::Interface& interface);
    // Time has passed, and no frame has come.
    void advance(std::int64_t nanoseconds);
    // No frame follows: what is open is handed out as it stands.
    void finish();

    // Calls that have not ended, of all D channels, in order of their beginning.
    std::vector<const Call*> open() const;
    // Calls that were let go before their end, since too many were alive.
    std::uint64_t dropped() const;
    // Calls that have begun, which are numbered from 1.
    std::uint64_t begun() const { return numbers_->last; }
    // Of each D channel from which a frame has come, by name.
    std::vector<Span> spans() const;
    // What is known of the links of a D channel; null if nothing has come from it.
    const DChannel* dChannel(std::string_view name) const;

  private:
    class Group;
    struct Channel;

    Channel& channelOf(const capture::Interface& interface);
    std::uint32_t groupOf(const std::string& name);

    Options options_;
    Listener& listener_;
    std::vector<std::unique_ptr<Group>> groups_;
    std::map<std::string, std::unique_ptr<Channel>, std::less<>> channels_;
    Channel* last_ = nullptr;  // the one of the last frame
    std::unique_ptr<CallNumbers> numbers_;
};

}  // namespace calls

#endif
