// Follows messages that demand an answer, and reports answers that did not come in time (Q.931 5 and 9).
#ifndef CALLS_WAITS_H
#define CALLS_WAITS_H

#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "calls/CallTable.h"
#include "calls/FindingKinds.h"
#include "calls/FindingSink.h"
#include "calls/LinkWitness.h"
#include "calls/Timers.h"

namespace calls {

// An answer counts as missing only if the timer ran out within the trace, the link was up all the time, the
// receiver's link layer acknowledged the question, and no frame of the answering side is missing. Otherwise
// it cannot be told, and a note says why. Nothing is reported while only one direction has been seen.
class Waits : public CallObserver {
  public:
    Waits(const Timers& timers, const LinkWitnesses& links, FindingSink& sink)
        : timers_(timers), links_(links), sink_(sink) {}

    void heard(Call& call, const Message& message) override;
    void ended(Call& call, const Message* by) override;

    // The board restarted. Drops all waits, because nobody knows whether the answers came.
    void boardRestarted();
    // The clock has come to `at`. Call this before handing in what happened at that time.
    void advance(std::int64_t at);

  private:
    struct Rule;
    static const std::vector<Rule>& rules();

    // The timer that the asker starts.
    struct Timer {
        std::string_view name;
        std::int64_t value = 0;
    };
    // One question of a call, and its repetitions.
    struct Wait {
        const Rule* rule = nullptr;
        Call* call = nullptr;
        Side asker = Side::us;
        std::uint8_t tei = 0;
        Moment first;
        Moment last;  // the latest repetition
        unsigned repetitions = 0;
        std::int64_t deadline = 0;
        Timer timer;
    };
    using Deadlines = std::set<std::pair<std::int64_t, std::uint64_t>>;  // when, and which wait

    // Returns whether the message answers the other side's DISCONNECT.
    bool answer(Call& call, const Message& message);
    void ask(Call& call, const Message& message);
    void repeat(Wait& wait, const Message& message);
    void expire(const Wait& wait, std::int64_t until);
    void drop(std::uint64_t id);
    void dropAll(const Call& call);
    Timer timerOf(const Rule& rule, const Message& message) const;
    void report(const FindingKind& kind, const Wait& wait, std::string sentence);
    std::vector<std::uint64_t> waitsOf(const Call& call) const;

    const Timers& timers_;
    const LinkWitnesses& links_;
    FindingSink& sink_;
    std::map<std::uint64_t, Wait> waits_;
    std::map<std::uint64_t, std::vector<std::uint64_t>> ofCall_;  // waits by number of the call
    Deadlines deadlines_;
    unsigned seen_ = 0;                     // bits 1 and 2: sides that have sent
    std::set<std::uint8_t> acknowledging_;  // TEIs of users that acknowledge CONNECT
    std::uint64_t lastId_ = 0;
};

}  // namespace calls

#endif
