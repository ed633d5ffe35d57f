// Turns frames into calls: finds the call of each frame, follows the calls, and reports findings.
#ifndef CALLS_ANALYSIS_H
#define CALLS_ANALYSIS_H

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "calls/Call.h"
#include "calls/CallTable.h"
#include "calls/DChannel.h"
#include "calls/Finding.h"
#include "calls/Maintenance.h"
#include "calls/Timers.h"
#include "capture/Frame.h"
#include "isdn/Variant.h"

namespace calls {

// Is told the results, each as soon as it is certain.
class Listener {
  public:
    Listener() = default;
    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;
    virtual ~Listener() = default;

    // A message that the receiver's layer 2 has accepted; if it came in segments, the whole message. `call`
    // is null if it belongs to none. The message may belong to an earlier frame than the one that was handed
    // in last.
    virtual void heard(const Message& /*message*/, const Call* /*call*/) {}
    // A frame that carries a message without being the one by which it is heard: a copy that the receiver's
    // layer 2 does not hand up, or a segment. `call` is null if it belongs to none. It may come up to ten
    // seconds of the trace late. Every frame of call control that carries a message comes either here or in
    // `heard`; only one that stood behind a hole for longer than that may come here first and there later.
    virtual void carried(const Message& /*message*/, const Call* /*call*/) {}
    // The call has ended. Late messages of it may still be heard. Is not called for a call that outlives the
    // trace.
    virtual void ended(const Call& /*call*/) {}
    // Nothing will change in the call any more, and its object goes. Calls that share a table come in the
    // order of their end.
    virtual void gone(const Call& /*call*/) {}
    virtual void found(const Finding& /*finding*/) {}
};

// What the two sides say about the use of a B channel.
struct ChannelService {
    Service service = Service::in;
    std::optional<Side> blockedBy{};  // the side that has taken it out of service
    bool restarting = false;
};

// From when until when frames of a D channel were heard, in nanoseconds on its clock.
struct Span {
    std::string dChannel;
    std::uint32_t group = 0;  // the number of its group, as in Call
    std::int64_t from = 0;
    std::int64_t until = 0;
};

struct Options {
    Timers timers;
    capture::Role role = capture::Role::unknown;   // the role of our side, if the user gives it
    isdn::Variant variant = isdn::Variant::net5;   // used for D channels whose variant is not known
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

    // `number` is the frame's number in the input, from 1. The frame's interface must not be null. Returns
    // what the frame is to its link; the result is valid until the next call.
    const Marks& take(const capture::Frame& frame, std::uint64_t number);
    // The recorder may have missed frames of this D channel. `reason` says why and must be a literal.
    void mayMiss(const capture::Interface& interface, std::string_view reason);
    // The recorder has seen a frame of `side` without its octets.
    void mayLack(const capture::Interface& interface, Side side);
    // The recorder or the board was started again.
    void restarted(const capture::Interface& interface);
    // So much time has passed without a frame.
    void advance(std::int64_t nanoseconds);
    // The trace has ended. Hands out what is open as it stands.
    void finish();

    // The calls of all D channels that have not ended, in order of their beginning.
    std::vector<const Call*> open() const;
    // How many calls were dropped before their end, because too many were alive.
    std::uint64_t dropped() const;
    // How many calls have begun. They are numbered from 1.
    std::uint64_t begun() const { return numbers_->last; }
    // The spans of all D channels from which a frame has come, in order of their names.
    std::vector<Span> spans() const;
    // The links of a D channel, or null if no frame has come from it.
    const DChannel* dChannel(std::string_view name) const;
    // What RESTART and SERVICE have made of a channel of a group that `spans` has named.
    ChannelService serviceOf(std::uint32_t group, const ChannelKey& channel) const;

  private:
    class Group;
    struct Channel;

    Channel& channelOf(const capture::Interface& interface);
    std::uint32_t groupOf(const std::string& name);
    bool mayCallsGoOn(const Channel& channel, std::uint8_t tei) const;

    Options options_;
    Listener& listener_;
    std::vector<std::unique_ptr<Group>> groups_;
    std::map<std::string, std::unique_ptr<Channel>, std::less<>> channels_;
    Channel* last_ = nullptr;  // the channel of the last frame
    std::unique_ptr<CallNumbers> numbers_;
};

}  // namespace calls

#endif
