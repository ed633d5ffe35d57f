// Parcels on their way: sent until they are safe, and reported in the order of each D channel.
#ifndef FLEET_SHIP_OUTBOX_H
#define FLEET_SHIP_OUTBOX_H

#include <chrono>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "fleet/Carrier.h"
#include "fleet/Parcel.h"

namespace fleet {

struct OutboxRules {
    std::size_t most = 256;                    // parcels on their way
    std::size_t mostOfOne = 32;                // of one D channel
    std::size_t mostOctets = 16 << 20;         // of all of them
    std::chrono::milliseconds patience{5000};  // for an answer; then a parcel is sent again
    std::chrono::milliseconds pause{1000};     // before one is sent again that was refused
};

// What was sent, for whoever watches.
struct OutboxFigures {
    std::uint64_t sent = 0;  // parcels, each time they were sent
    std::uint64_t octets = 0;
    std::uint64_t kept = 0;
    std::uint64_t duplicates = 0;  // of those kept: the stream had them before
    std::uint64_t refused = 0;     // answers that say no
    std::uint64_t unanswered = 0;  // in time
    bool isFull = false;           // the newest refusal was for want of room
    std::string refusal;           // in words; empty once one was kept behind it
};

// What is known to be safe of a D channel.
struct SafeUpTo {
    std::uint64_t run = 0;
    std::uint64_t next = 1;
    bool isEnded = false;
};

class Outbox {
  public:
    using Safe = std::function<void(std::size_t dChannel, const SafeUpTo&)>;

    // `safe` is called by pump(), for each D channel in the order of its parcels.
    Outbox(const OutboxRules& rules, Safe safe) : rules_(rules), safe_(std::move(safe)) {}

    // D channels are numbered by the caller, from 0.
    bool hasRoom(std::size_t dChannel) const;
    void add(std::size_t dChannel, const Parcel& parcel);
    // How many of its parcels are not reported as safe.
    std::size_t waiting(std::size_t dChannel) const;
    // The time of the first frame in the oldest of these, in nanoseconds since 1970; nothing if it has none.
    std::optional<std::int64_t> oldestWaiting(std::size_t dChannel) const;

    // Sends what is to be sent, and takes answers: those that are there, or the first one to come within the
    // time. Throws NatsError if the carrier does; what was not answered stays.
    void pump(Carrier& carrier, std::chrono::milliseconds wait);
    // With a new connection: what was not answered is sent again.
    void sendAllAgain();

    bool isEmpty() const { return parcels_.empty(); }
    const OutboxFigures& figures() const { return figures_; }

  private:
    using Clock = std::chrono::steady_clock;

    struct Sent {
        std::size_t dChannel;
        std::string subject;
        std::string text;
        std::string id;
        SafeUpTo then;
        std::optional<std::int64_t> time;  // of its first frame
        Clock::time_point due{};           // when it is sent (again)
        bool isOut = false;                // it waits for an answer
        bool isKept = false;
    };

    void sendDue(Carrier& carrier);
    void take(const Carrier::Answer& answer);
    void settle(std::size_t dChannel);

    OutboxRules rules_;
    Safe safe_;
    std::map<std::uint64_t, Sent> parcels_;  // by token, in their order
    std::vector<std::deque<std::uint64_t>> ofDChannel_;
    std::uint64_t tokens_ = 0;
    std::size_t octets_ = 0;
    Clock::time_point nextDue_{};  // nothing is to be sent before
    OutboxFigures figures_;
};

}  // namespace fleet

#endif
