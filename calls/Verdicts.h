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
// and no frame of the answering side is missing between `asked` and `until`. The numbers of a later frame may
// be needed to show that none is missing, so the finding waits for such a frame: up to T203, and after a
// silence up to T203 from the first frame of the link. If one of the
// conditions does not hold, a note says that it cannot be told whether the answer was sent; questions with
// the same reason share one note. Nothing is reported if only one direction was heard on the link. Memory is
// bounded.
class Verdicts {
  public:
    Verdicts(const Timers& timers, const LinkWitnesses& links, FindingSink& sink)
        : timers_(timers), links_(links), sink_(sink) {}

    enum class Verdict : std::uint8_t { nothing, fault, held, cannotBeTold };
    Verdict judge(Unanswered question);

    // The clock has come to `at`. `oldest` is the time at which the oldest question that still waits for its
    // answer was asked. A shared note is reported when no waiting question can have its reason.
    void advance(std::int64_t at, std::int64_t oldest);
    // Whether the decision about some question still waits for a later frame.
    bool isHolding() const { return !held_.empty(); }
    // The end of the trace: what is held is reported as it stands.
    void finish();
    // The board restarted: what is held cannot be decided any more.
    void forget() { held_.clear(); }

  private:
    struct Held {
        Unanswered question;
        std::int64_t
            since;  // the waiting began: when the timer ran out, or the link was heard again after it
        bool heardAgain = false;
    };
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
    std::int64_t now_ = 0;
    std::deque<Held> held_;
    std::map<std::pair<std::uint8_t, std::string_view>, Doubtful> doubtful_;  // by TEI and reason
};

}  // namespace calls

#endif
