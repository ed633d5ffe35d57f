// Follows RESTART and SERVICE, with which the two sides reset channels and take them out of service (Q.931
// 5.5; the maintenance messages of North American trunks).
#ifndef CALLS_MAINTENANCE_H
#define CALLS_MAINTENANCE_H

#include <array>
#include <bitset>
#include <compare>
#include <cstdint>
#include <deque>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "calls/Call.h"
#include "calls/FindingSink.h"
#include "calls/GatheredFindings.h"
#include "calls/LinkWitness.h"
#include "calls/Message.h"
#include "calls/Timers.h"
#include "calls/Verdicts.h"

namespace calls {

// One B channel of a group. The interface is empty if the message does not name it.
struct ChannelKey {
    std::optional<std::uint32_t> interface;
    std::uint32_t number = 0;
    auto operator<=>(const ChannelKey&) const = default;
};
// The channels that an element names, in order.
std::vector<ChannelKey> channelsOf(const std::optional<isdn::ChannelId>& channel);
// "7", or "2/7" with an interface.
std::string toString(const ChannelKey& channel);

// How usable a side says that a channel is; the worse of the two sides counts.
enum class Service : std::uint8_t { in, maintenance, out };

class Maintenance {
  public:
    Maintenance(const Timers& timers, const LinkWitnesses& links, FindingSink& sink);

    // Takes every message, and passes over those that are not RESTART, SERVICE or their answers.
    void take(const Message& message);
    // The clock has come to `at`. Call this before handing in what happened at that time.
    void advance(std::int64_t at);
    // The end of the trace. Timers that run are void.
    void finish();
    // The board restarted: whether an answer came is not known.
    void boardRestarted();

    Service serviceOf(const ChannelKey& channel) const;
    // The side that has taken the channel furthest out of service; empty if it is in service.
    std::optional<Side> blockedBy(const ChannelKey& channel) const;
    // A RESTART that names it, or all channels, waits for its answer.
    bool isRestarting(const ChannelKey& channel) const;

  private:
    // What a message is about.
    struct Target {
        std::uint8_t kind = 0;  // restart class, or status of SERVICE
        std::optional<std::uint32_t> interface;
        std::bitset<128> channels;
        bool operator==(const Target&) const = default;
    };
    struct Asked {
        bool service = false;
        Target target;
        Side asker = Side::us;
        std::uint8_t tei = 0;
        std::string dChannel;
        Moment first;
        Moment last;
        unsigned repetitions = 0;
        std::int64_t due = 0;  // when the answer is overdue; never, unless somebody waits for it
    };
    // What is told of one side's questions. Those that waited together have one cause.
    struct Told {
        Told(FindingSink& sink, Side asker);
        GatheredFindings restarts, services, storms;
    };

    void restart(const Message& message);
    void restartAcknowledge(const Message& message);
    void service(const Message& message);
    void serviceAcknowledge(const Message& message);
    void ask(const Message& message, const Target& target, bool isService);
    void countRestart(const Message& message, const Target& target);
    std::int64_t dueAfterRepetition(const Asked& asked) const;
    void expire(const Asked& asked);
    Told& toldOf(Side asker) { return told_[static_cast<std::size_t>(asker)]; }
    void completeTold(std::int64_t at);
    bool isComplete(const GatheredFindings& gathered, Side asker, bool service) const;

    const Timers& timers_;
    FindingSink& sink_;
    std::array<Told, 2> told_;
    Verdicts verdicts_;
    std::vector<Asked> asked_;  // at most `mostAsked`, the oldest first
    std::array<bool, 2> acknowledgesService_{};
    std::map<std::pair<Side, ChannelKey>, Service> status_;
    // Times of the last restarts by side and channel; class 6 and 7 count as channels of their own.
    std::map<std::pair<Side, ChannelKey>, std::deque<std::int64_t>> restarts_;
};

}  // namespace calls

#endif
