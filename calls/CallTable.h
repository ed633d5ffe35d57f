// The calls of one D channel, or of one group of D channels that share their calls: which message belongs to
// which life of a call reference, and what it says about the call (Q.931 4.3, 5).
#ifndef CALLS_CALLTABLE_H
#define CALLS_CALLTABLE_H

#include <compare>
#include <cstddef>
#include <list>
#include <map>
#include <memory>
#include <optional>
#include <vector>

#include "calls/Call.h"
#include "calls/Message.h"
#include "calls/Timers.h"

namespace calls {

// Is told what happens to calls, in order of time. A call's object keeps its address until `gone` has
// returned.
class CallObserver {
  public:
    CallObserver() = default;
    CallObserver(const CallObserver&) = delete;
    CallObserver& operator=(const CallObserver&) = delete;
    virtual ~CallObserver() = default;

    // A message of a call, after the call has taken it over. The first message of a call comes here as well.
    virtual void heard(Call& /*call*/, const Message& /*message*/) {}
    // The call has ended; stragglers may still be heard. `by` is null if no message ended it.
    virtual void ended(Call& /*call*/, const Message* /*by*/) {}
    // Nothing will change in the call any more, and it is forgotten now.
    virtual void gone(const Call& /*call*/) {}
    // SETUP, RESUME or REGISTER took the reference of a call that was alive.
    virtual void replaced(Call& /*old*/, Call& /*by*/, const Message& /*message*/) {}
    // A message whose call reference belonged to a call that ended long ago.
    virtual void stray(const Message& /*message*/) {}
};

// Distinguishes the calls of one group that are alive at the same time.
struct CallKey {
    std::uint64_t value = 0;  // of the call reference, without the flag
    std::uint8_t tei = 0;
    Side origin = Side::us;  // the side that chose the value
    auto operator<=>(const CallKey&) const = default;
};

// Gives numbers to the calls of all tables.
struct CallNumbers {
    std::uint64_t last = 0;
};

struct Life;  // a call, and what the table needs to know besides

class CallTable {
  public:
    // The largest number of calls that are alive, and of ended calls that are remembered. Beyond it the
    // oldest is dropped and counted.
    static constexpr std::size_t mostAlive = 65536;
    static constexpr std::size_t mostRemembered = 65536;

    CallTable(const Timers& timers, CallNumbers& numbers, CallObserver& observer);
    ~CallTable();
    CallTable(const CallTable&) = delete;
    CallTable& operator=(const CallTable&) = delete;

    // Takes the next message, in the order in which they passed. Returns its call, which is valid until the
    // next call of a member function. Returns null if the message belongs to none: it has the dummy or the
    // global reference, is of another protocol, or is a stray.
    Call* take(const Message& message);

    // The call whose reference the message bears, or null if none is known. Does not take the message.
    const Call* callOf(const Message& message) const;

    // Takes a RESTART ACKNOWLEDGE: ends the calls whose channels it names.
    void restarted(const Message& acknowledge);

    // The clock has come to `at`. Ends calls and forgets references whose time has come.
    void advance(std::int64_t at);
    // The link of a TEI went down, or came up again.
    void linkDown(std::uint8_t tei, std::int64_t at);
    void linkUp(std::uint8_t tei);
    // Messages of this TEI are missing in the trace: its calls may have ended unseen.
    void framesLost(std::uint8_t tei);
    // The board restarted. Marks the calls that are open as uncertain.
    void boardRestarted();

    // The trace has ended. Reports every call as it stands.
    void finish();

    // How many calls were dropped before their end, because too many were alive.
    std::uint64_t dropped() const { return dropped_; }
    std::size_t alive() const { return lives_.size(); }

    // Calls that have not ended, in order of their beginning.
    std::vector<const Call*> open() const;

  private:
    using Lives = std::map<CallKey, std::unique_ptr<Life>>;
    using Deadlines = std::multimap<std::int64_t, std::pair<CallKey, std::uint64_t>>;

    Life* find(const CallKey& key) const;
    Life* findBroadcast(const Message& message, const CallKey& key) const;
    Life& begin(const Message& message, const CallKey& key);
    Life& beginOrRepeat(const Message& message, const CallKey& key);
    Life* belongsTo(const Message& message, const CallKey& key);
    bool repeats(const Life& life, const Message& message) const;
    void hear(Life& life, const Message& message);
    void endIfLast(Life& life, const Message& message);
    void endTerminal(Life& life, const Message& message);
    void end(Life& life, EndedBy by, const Moment& moment, const Message* message);
    void endIfAllTerminalsLeft(Life& life, const Moment& moment, const Message* message);
    void forget(Life& life);
    void remember(const CallKey& key, std::int64_t at);
    void dropOldest();
    void due(Life& life, std::int64_t at);
    void schedule(Life& life, std::int64_t at);
    void awaitTerminals(Life& life);
    void endLostLinks(std::int64_t at);
    void noteHeard(Life& life);
    void joinSuspended(Life& life, const Message& message);

    const Timers& timers_;
    CallNumbers& numbers_;
    CallObserver& observer_;
    Lives lives_;
    std::map<std::uint64_t, CallKey> inOrder_;  // keys of the lives, by number of the call
    Deadlines deadlines_;
    std::map<std::uint8_t, std::int64_t> downSince_;  // by TEI
    std::map<CallKey, std::int64_t> remembered_;      // keys of calls that are gone, and when they ended
    std::list<CallKey> rememberedInOrder_;            // oldest first

    // Numbers of the calls that were heard since frames were lost last, and when that was, by TEI.
    std::vector<std::uint64_t> heardSinceLoss_;
    std::map<std::uint8_t, std::int64_t> lostAt_;
    std::int64_t now_ = 0;

    struct Suspended {
        std::uint64_t call;
        std::int64_t at;
        std::vector<std::uint8_t> identity;
    };
    std::list<Suspended> suspended_;
    std::uint64_t dropped_ = 0;
};

}  // namespace calls

#endif
