// Findings that one message of a call shows, without a timer: elements, causes, states, references.
#ifndef CALLS_CALLFINDINGS_H
#define CALLS_CALLFINDINGS_H

#include <array>
#include <cstdint>
#include <map>

#include "calls/CallTable.h"
#include "calls/FindingKinds.h"
#include "calls/FindingSink.h"
#include "calls/HeldFindings.h"
#include "calls/LinkWitness.h"
#include "calls/Timers.h"

namespace calls {

class CallFindings : public CallObserver {
  public:
    CallFindings(const Timers& timers, const LinkWitnesses& links, FindingSink& sink)
        : timers_(timers), sink_(sink), held_(links, sink) {}

    void heard(Call& call, const Message& message) override;
    void ended(Call& call, const Message* by) override;
    void gone(const Call& call) override { notes_.erase(call.number); }
    void replaced(Call& old, Call& by, const Message& message) override;
    void stray(const Message& message) override;
    // Takes a message of the global or the dummy reference, or one that belongs to no call.
    void heardWithoutCall(const Message& message);
    // Call this before each frame is handed in.
    void advance() { held_.advance(); }
    // The board restarted. What depends on earlier messages cannot be told any more.
    void boardRestarted() { held_.forget(); }

  private:
    // What is remembered about a call that is alive.
    struct Notes {
        std::array<bool, 2> enquired{};  // a side's STATUS ENQUIRY has passed, not yet answered
        bool acknowledged = false;       // SETUP ACKNOWLEDGE has passed, and nothing later
        bool sendingComplete = false;
        bool cleared = false;  // a clearing message has passed
        bool channelChecked = false;
        bool channelDemanded = false;  // the other side has answered SETUP
        std::int64_t lastDigit = 0;    // when the last digit, SETUP or SETUP ACKNOWLEDGE passed
    };

    void checkElements(const Call* call, const Message& message, bool clearsFirst);
    void checkCause(const Call* call, const Message& message);
    void checkStatus(const Call& call, Notes& notes, const Message& message);
    void checkDigits(const Call& call, Notes& notes, const Message& message);
    void demandChannel(const Call& call, Notes& notes, const Message& message);
    void checkChannel(const Call& call, Notes& notes, const Message& message);
    void report(const FindingKind& kind, const Call* call, const Message& message, std::string sentence);
    // For what depends on the messages before this one.
    void reportUnlessLost(const FindingKind& kind, const Call& call, const Message& message,
                          std::string sentence);

    const Timers& timers_;
    FindingSink& sink_;
    HeldFindings held_;
    std::map<std::uint64_t, Notes> notes_;  // by number of the call
};

}  // namespace calls

#endif
