// Follows which call holds which B channel, and reports what goes wrong with it (Q.931 5.1.2, 5.2.3, 5.7).
#ifndef CALLS_CHANNELS_H
#define CALLS_CHANNELS_H

#include <array>
#include <cstdint>
#include <map>
#include <vector>

#include "calls/CallTable.h"
#include "calls/FindingSink.h"
#include "calls/Maintenance.h"
#include "calls/StuckChannels.h"
#include "calls/Timers.h"

namespace calls {

// One object serves one table of calls. A call holds a channel from its grant until the call ends or is put
// on hold. A channel that was only asked for is not held.
class Channels : public CallObserver {
  public:
    // `stuck` is told of channels whose calls went without clearing.
    Channels(const Timers& timers, const Maintenance& maintenance, StuckChannels& stuck, FindingSink& sink)
        : timers_(timers), maintenance_(maintenance), stuck_(stuck), sink_(sink) {}

    void heard(Call& call, const Message& message) override;
    void ended(Call& call, const Message* by) override;
    void gone(const Call& call) override;
    // Takes a RESTART ACKNOWLEDGE: the channels that it names are free now, whatever was wrong with them.
    void restarted(const Message& acknowledge);
    // The board restarted. Which call holds which channel is not known any more.
    void boardRestarted();
    // Messages are missing in the trace: calls that are not in it may have taken channels since.
    void framesLost();
    // The clock has come to `at`. Call this before handing in what happened at that time.
    void advance(std::int64_t at);
    // The numbers of the calls that hold a channel, by channel. Has an entry, perhaps an empty one, for each
    // channel that was ever named.
    std::map<ChannelKey, std::vector<std::uint64_t>> holders() const;

  private:
    struct State {
        std::vector<std::uint64_t> holders;  // numbers of calls
        bool seenFree = false;               // a call has left it, or it was restarted
        unsigned refusals = 0;               // how often cause 44 or 82 refused it although it was idle
    };
    // What is remembered about a call that is alive.
    struct Seizure {
        const Call* call = nullptr;  // there as long as this is
        std::vector<ChannelKey> asked;
        std::vector<ChannelKey> held;
        bool answered = false;  // the other side has answered SETUP
        bool numbered = false;  // SETUP came in an I frame
        std::int64_t setupAt = 0;
        std::uint8_t setupNs = 0;
        std::uint64_t glare = 0;  // the number of the call that crosses this one, or 0
        bool glareSettled = false;
        bool outOfServiceSaid = false;
    };
    // Two calls on one channel. Reported only if both are still there a moment later, because the recorder
    // may give frames of the two directions in the wrong order.
    struct Conflict {
        ChannelKey channel;
        std::uint64_t first;
        std::uint64_t second;
        std::int64_t deadline;
        Finding finding;
    };
    // The order in which a side takes channels.
    struct Hunting {
        std::uint32_t last = 0;
        unsigned up = 0;
        unsigned down = 0;
    };

    void setUp(Call& call, Seizure& seizure, const Message& message);
    void findGlare(Call& call, Seizure& seizure, const Message& message);
    void hunt(const Call& call, const Seizure& seizure, const Message& message);
    void hold(Call& call, Seizure& seizure, const Message& message);
    void findDoubleSeizure(const Call& call, const ChannelKey& key, State& state, const Message& message);
    void checkService(const Call& call, Seizure& seizure, const std::vector<ChannelKey>& channels,
                      const Message& message);
    void release(std::uint64_t call, Seizure& seizure);
    void settleGlare(Call& call, Seizure& seizure, const Message* message);
    void noteRefusal(const Call& call, const Seizure& seizure);
    bool isKnownIdle(const std::vector<ChannelKey>& channels) const;
    State* stateOf(const ChannelKey& key);

    static constexpr std::size_t mostChannels = 8192;

    const Timers& timers_;
    const Maintenance& maintenance_;
    StuckChannels& stuck_;
    FindingSink& sink_;
    std::map<ChannelKey, State> states_;
    std::map<std::uint64_t, Seizure> seizures_;  // by number of the call
    std::vector<Conflict> conflicts_;
    std::array<Hunting, 2> hunting_;
    bool glareProneSaid_ = false;
};

}  // namespace calls

#endif
