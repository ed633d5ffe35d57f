// Decides about questions that got no answer in time: whether that is a fault, or whether the answer may only
// be missing in the trace.
#ifndef CALLS_VERDICTS_H
#define CALLS_VERDICTS_H

#include <cstdint>
#include <deque>
#include <map>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "calls/Finding.h"
#include "calls/FindingSink.h"
#include "calls/LinkWitness.h"
#include "calls/Timers.h"

namespace calls {

// A question whose timer ran out. Moments are on the clock of its D channel.
struct Unanswered {
    Finding finding;       // if it is a fault
    std::uint8_t tei = 0;  // of the link on which it was asked
    Side asker = Side::us;
    Side answering = Side::peer;
    std::uint64_t frame = 0;  // in which it was asked first
    std::int64_t asked = 0;
    std::int64_t until = 0;           // when the timer ran out
    FindingSink* gathered = nullptr;  // is told if it is a fault, instead of the sink of the others
};

// A missing answer is a fault only if the link was up, the receiver's link layer acknowledged the question,
// and no frame of the answering side is missing between `asked` and `until`. The last of these may show only
// in the numbers of a later frame, so that a finding waits for one, up to T203. Otherwise a note says
// that it cannot be told; questions that have one reason for it share one note. Nothing is said if only one
// direction was heard on the link. Memory is bounded.
class Verdicts {
  public:
    Verdicts(const Timers& timers, const LinkWitnesses& links, FindingSink& sink)
        : timers_(timers), links_(links), sink_(sink) {}

    enum class Verdict : std::uint8_t { nothing, fault, held, cannotBeTold };
    Verdict judge(Unanswered question);

    // The clock has come to `at`. `oldest` is when the oldest question was asked that still waits for its
    // answer: a shared note is complete when no question is left that its reason touches.
    void advance(std::int64_t at, std::int64_t oldest);
    // Whether it is not certain yet of some question that it is a fault.
    bool isHolding() const { return !held_.empty(); }
    // The end of the trace: what is held is reported as it stands.
    void finish();
    // The board restarted: what is held cannot be decided any more.
    void forget() { held_.clear(); }

  private:
    struct Doubtful {
        Finding first;
        std::vector<std::string> calls;
        std::int64_t since = 0;  // questions asked by then may share it
    };

    static std::string_view doubtAbout(const Unanswered& question, const LinkWitness* link);
    void doubt(Unanswered question, std::string_view reason, const LinkWitness* link);
    // Once `isOver`, what is still held is reported as it stands.
    void reconsider(std::int64_t at, bool isOver);
    void report(Unanswered& fault);
    void report(Doubtful& doubtful, std::string_view reason);

    static constexpr std::size_t mostHeld = 4096;

    const Timers& timers_;
    const LinkWitnesses& links_;
    FindingSink& sink_;
    std::deque<Unanswered> held_;
    std::map<std::pair<std::uint8_t, std::string_view>, Doubtful> doubtful_;  // by TEI and reason
};

}  // namespace calls

#endif
