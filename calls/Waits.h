// Follows messages that demand an answer, and reports answers that did not come in time (Q.931 5 and 9).
#ifndef CALLS_WAITS_H
#define CALLS_WAITS_H

#include <cstdint>
#include <limits>
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
#include "calls/Verdicts.h"

namespace calls {

// An answer counts as missing only if the timer ran out within the trace, and if Verdicts has no doubt about
// it. The timer has run out, too, when the side that waits clears the call and says so (cause 102), or does
// it at the very moment.
class Waits : public CallObserver {
  public:
    Waits(const Timers& timers, const LinkWitnesses& links, FindingSink& sink)
        : timers_(timers), sink_(sink), verdicts_(timers, links, sink) {}

    void heard(Call& call, const Message& message) override;
    void ended(Call& call, const Message* by) override;

    // The board restarted. Drops all waits, because nobody knows whether the answers came.
    void boardRestarted();
    // The clock has come to `at`. Call this before handing in what happened at that time.
    void advance(std::int64_t at);
    // The end of the trace. Timers that run are void.
    void finish() { verdicts_.finish(); }

  private:
    struct Rule;
    static const std::vector<Rule>& rules();

    static constexpr std::int64_t never = std::numeric_limits<std::int64_t>::max();

    // The timer that the waiting side starts.
    struct Timer {
        std::string_view name;
        std::int64_t value = 0;
        std::string_view clause{};  // empty: that of the finding
    };
    // One question of a call, and its repetitions.
    struct Wait {
        const Rule* rule = nullptr;
        Call* call = nullptr;
        Side asker = Side::us;
        std::uint8_t tei = 0;
        Moment first;
        Moment last;  // the latest repetition, or what restarted the timer
        unsigned repetitions = 0;
        std::int64_t deadline = 0;  // never: the timer was stopped
        Timer timer;

        Side answering() const;
        Side waiting() const { return other(answering()); }
    };
    using Deadlines = std::set<std::pair<std::int64_t, std::uint64_t>>;  // when, and which wait

    // What a message of a call does to one of its waits.
    enum class Effect : std::uint8_t { none, answers, endsIt, restarts, stops, timerRanOut, noMoreDigits };

    Effect effectOf(const Wait& wait, const Message& message) const;
    // Returns whether the message answers the other side's DISCONNECT.
    bool answer(Call& call, const Message& message, bool& timerTold);
    void ask(Call& call, const Message& message);
    void repeat(std::uint64_t id, Wait& wait, const Message& message);
    Verdicts::Verdict expire(const Wait& wait, std::int64_t until);
    void setDeadline(std::uint64_t id, Wait& wait, std::int64_t deadline);
    void drop(std::uint64_t id);
    void dropAll(const Call& call);
    Timer timerOf(const Rule& rule, const Message& message) const;
    std::vector<std::uint64_t> waitsOf(const Call& call) const;

    const Timers& timers_;
    FindingSink& sink_;
    Verdicts verdicts_;
    std::map<std::uint64_t, Wait> waits_;                         // the oldest first
    std::map<std::uint64_t, std::vector<std::uint64_t>> ofCall_;  // waits by number of the call
    Deadlines deadlines_;
    std::set<std::uint8_t> acknowledging_;  // TEIs of users that acknowledge CONNECT
    std::uint64_t lastId_ = 0;
};

}  // namespace calls

#endif
