// What shows in several calls together: they end at once, last equally long, or fail for one reason.
#ifndef CALLS_PATTERNS_H
#define CALLS_PATTERNS_H

#include <cstdint>
#include <deque>
#include <map>
#include <string>

#include "calls/CallTable.h"
#include "calls/FindingSink.h"

namespace calls {

// One object for each table of calls. Looks at calls that have ended, in the order in which they are handed
// out. Memory is bounded: it remembers the last few.
class Patterns : public CallObserver {
  public:
    explicit Patterns(FindingSink& sink) : sink_(sink) {}
    void ended(Call& call, const Message* by) override;

  private:
    struct Failure {
        std::int64_t at;
        std::uint8_t cause;
        std::string prefix;  // the first digits of the number called
        std::string channel;
        std::string bearer;
    };

    void findMassClear(const Call& call);
    void findSameDuration(const Call& call);
    void findCauseBurst(const Call& call);

    FindingSink& sink_;
    std::deque<std::int64_t> lost_;       // when calls ended with their link
    std::deque<std::int64_t> durations_;  // of the last answered calls
    std::deque<std::int64_t> lengthsSaid_;
    std::deque<Failure> failures_;
    std::map<std::uint8_t, std::int64_t> burstSaid_;  // by cause
};

}  // namespace calls

#endif
