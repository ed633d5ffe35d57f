// Holds parcels until the stream has confirmed them, sends them again if need be, and reports which are safe.
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
    std::size_t most = 256;                    // parcels that are held
    std::size_t mostOfOne = 32;                // of these, parcels of one D channel
    std::size_t mostOctets = 16 << 20;         // of all their texts
    std::chrono::milliseconds patience{5000};  // without an answer, a parcel is sent again after this time
    std::chrono::milliseconds pause{1000};     // a parcel that was refused is sent again after this time
};

// Counts of what was sent and answered, for the program's figures.
struct OutboxFigures {
    std::uint64_t sent = 0;  // parcels, each time they were sent
    std::uint64_t octets = 0;
    std::uint64_t kept = 0;
    std::uint64_t duplicates = 0;  // of those kept: the stream had them before
    std::uint64_t refused = 0;     // answers that say no
    std::uint64_t failures = 0;    // of these, answers for another reason than a limit of the stream
    std::uint64_t forgotten = 0;   // answers with a number that the stream had given to another parcel before
    std::uint64_t unanswered = 0;  // parcels sent again because no answer came in time
    bool isFull = false;           // the newest answer was a refusal for want of room
    std::string refusal;           // the newest refusal in words; empty once a parcel was kept after it
};

// All frames of a D channel before number `next` of `run` are safe: the stream has confirmed them. `isEnded`:
// the end of the run is safe as well.
struct SafeUpTo {
    std::uint64_t run = 0;
    std::uint64_t next = 1;
    bool isEnded = false;
};

class Outbox {
  public:
    using Safe = std::function<void(std::size_t dChannel, const SafeUpTo&)>;

    // pump() calls `safe` when more of a D channel is safe. A parcel counts only when all parcels of its D
    // channel before it are safe.
    Outbox(const OutboxRules& rules, Safe safe) : rules_(rules), safe_(std::move(safe)) {}

    // The caller numbers the D channels from 0, and adds a parcel only if there is room for it.
    bool hasRoom(std::size_t dChannel) const;
    void add(std::size_t dChannel, const Parcel& parcel);
    // How many parcels of the D channel were not reported as safe yet.
    std::size_t waiting(std::size_t dChannel) const;
    // The time of the first frame in the oldest of these, in nanoseconds since 1970; nothing if it has none.
    std::optional<std::int64_t> oldestWaiting(std::size_t dChannel) const;

    // Sends the parcels that are due, and takes the answers that have come; if there is none, waits at most
    // `wait` for the first. Throws NatsError if the carrier does; parcels without an answer stay.
    void pump(Carrier& carrier, std::chrono::milliseconds wait);
    // Call this when there is a new connection: the next pump() sends all parcels that are not kept again.
    void sendAllAgain();
    // Drops all parcels of the D channel. No more of it is safe until others are added and kept.
    void drop(std::size_t dChannel);
    // The ids of parcels that are added from now on end in this text. So the stream does not take them for
    // parcels that it says it has.
    void endIdsWith(std::string ending) { idEnding_ = std::move(ending); }
    // When the stream has taken a parcel that it did not have before, most recently.
    std::chrono::steady_clock::time_point newestKept() const { return newestKept_; }

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
        Clock::time_point due{};           // when it is sent, or sent again
        bool isOut = false;                // it waits for an answer
        bool isKept = false;
    };

    void sendDue(Carrier& carrier);
    void take(const Carrier::Answer& answer);
    void countRefusal(const Carrier::Answer& answer);
    void countKept(const Carrier::Answer& answer);
    void settle(std::size_t dChannel);

    OutboxRules rules_;
    Safe safe_;
    std::map<std::uint64_t, Sent> parcels_;  // by token, in their order
    std::vector<std::deque<std::uint64_t>> ofDChannel_;
    std::uint64_t tokens_ = 0;
    std::size_t octets_ = 0;
    Clock::time_point nextDue_{};  // no parcel is due before
    Clock::time_point newestKept_{};
    std::uint64_t highest_ = 0;  // number that the stream has given
    std::string idEnding_;
    OutboxFigures figures_;
};

}  // namespace fleet

#endif
