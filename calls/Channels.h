// Who holds which B channel, and what goes wrong about it (Q.931 5.1.2, 5.2.3, 5.7).
#ifndef CALLS_CHANNELS_H
#define CALLS_CHANNELS_H

#include <array>
#include <cstdint>
#include <map>
#include <vector>

#include "calls/CallTable.h"
#include "calls/FindingSink.h"
#include "calls/Maintenance.h"
#include "calls/Timers.h"

namespace calls {

// One object for each table of calls. A channel is held from its grant until the call has ended, or is on
// hold; a channel that was only asked for is held by nobody.
class Channels : public CallObserver {
  public:
    Channels(const Timers& timers, const Maintenance& maintenance, FindingSink& sink)
        : timers_(timers), maintenance_(maintenance), sink_(sink) {}

    void heard(Call& call, const Message& message) override;
    void ended(Call& call, const Message* by) override;
    void gone(const Call& call) override;
    // RESTART ACKNOWLEDGE: its channels are free, whatever was wrong with them.
    void restarted(const Message& acknowledge);
    // The board restarted: who holds what is not known any more.
    void boardRestarted();
    // The clock has come to `at`; to be called before what happened then is handed in.
    void advance(std::int64_t at);
    // The end of the trace.
    void finish();

    // The calls that hold a channel, by its key; channels that were ever named are there, free or not.
    std::map<ChannelKey, std::vector<std::uint64_t>> holders() const;

  private:
    struct State {
        std::vector<std::uint64_t> holders;  // numbers of calls
        bool seenFree = false;               // a call has left it, or it was restarted
        unsigned refusals = 0;               // 44 or 82 although it was idle
    };
    // What has to be known of a call that is alive.
    struct Seizure {
        Side origin = Side::us;
        std::vector<ChannelKey> asked;
        std::vector<ChannelKey> held;
        bool answered = false;  // the other side has taken it
        bool numbered = false;  // SETUP came in an I frame
        std::uint8_t setupNs = 0;
        std::uint64_t glare = 0;  // the call that crosses it, or 0
        bool glareSettled = false;
    };
    // Two calls on one channel: reported if they are still there a moment later, since frames of the two
    // directions may be reported the wrong way round.
    struct Conflict {
        ChannelKey channel;
        std::uint64_t first;
        std::uint64_t second;
        std::int64_t deadline;
        Finding finding;
    };
    // A channel whose call went without clearing: one end may still hold it.
    struct Orphan {
        std::int64_t at = 0;
        std::uint64_t call = 0;
        bool withLink = false;  // the call went with its link, like others perhaps
        Finding finding;
    };
    // In which order a side takes channels.
    struct Hunting {
        std::uint32_t last = 0;
        unsigned up = 0;
        unsigned down = 0;
    };

    void setUp(Call& call, Seizure& seizure, const Message& message);
    void findGlare(Call& call, Seizure& seizure, const Message& message);
    void hunt(const Call& call, const Seizure& seizure, const Message& message);
    void hold(Call& call, Seizure& seizure, const Message& message);
    void release(std::uint64_t call, Seizure& seizure);
    void settleGlare(Call& call, Seizure& seizure, const Message* message);
    void noteRefusal(const Call& call, const Seizure& seizure);
    void noteOrphan(const Call& call, const Seizure& seizure);
    void reportOrphans(std::int64_t before);
    bool isKnownIdle(const std::vector<ChannelKey>& channels) const;
    State* stateOf(const ChannelKey& key);

    static constexpr std::size_t mostChannels = 8192;

    const Timers& timers_;
    const Maintenance& maintenance_;
    FindingSink& sink_;
    std::map<ChannelKey, State> states_;
    std::map<std::uint64_t, Seizure> seizures_;  // by number of the call
    std::map<ChannelKey, Orphan> orphans_;       // reported if nobody restarts or takes them
    std::vector<Conflict> conflicts_;
    std::array<Hunting, 2> hunting_;
    bool glareProneSaid_ = false;
};

}  // namespace calls

#endif
