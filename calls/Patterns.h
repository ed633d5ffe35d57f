// Findings about several calls together: many end at once, many last equally long, many fail for one reason.
#ifndef CALLS_PATTERNS_H
#define CALLS_PATTERNS_H

#include <cstdint>
#include <deque>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "calls/CallTable.h"
#include "calls/FindingSink.h"
#include "calls/StuckChannels.h"

namespace calls {

// One object serves one table of calls. It looks at the calls that have ended, in the order in which the
// table reports them. Memory is bounded: it remembers the last few calls.
class Patterns : public CallObserver {
  public:
    // `stuck` is told of calls that went with their link: some of their channels may stay behind.
    Patterns(StuckChannels& stuck, FindingSink& sink) : stuck_(stuck), sink_(sink) {}
    void ended(Call& call, const Message* by) override;
    // A link went down, or was set up (again), in this frame.
    void linkChanged(const Moment& moment, const std::string& dChannel, bool isUp);
    // A fault of a link was reported at `at`. A mass-clear that follows from it refers to it.
    void linkFault(const Finding& fault, std::int64_t at);
    // The clock has come to `at`. Call this before handing in what happened at that time.
    void advance(std::int64_t at);
    // The end of the trace.
    void finish();

  private:
    struct Failure {
        std::int64_t at;
        std::uint8_t cause;
        std::string prefix;  // the first digits of the number called
        std::string channel;
        std::string bearer;
        std::string numberKind;  // "national/ISDN"
    };

    static std::string detailsOf(const Failure& failure);

    bool endsWithLink(const Call& call) const;
    void reportMassClear();
    void findSameDuration(const Call& call);
    void findCauseBurst(const Call& call);

    StuckChannels& stuck_;
    FindingSink& sink_;
    struct LinkChange {
        Moment moment;
        std::string dChannel;
        bool isUp = false;
    };

    struct LinkFault {
        std::int64_t at = 0;
        std::string dChannel;
        Severity severity = Severity::note;
        std::string words;  // "sabme-unanswered of frame 12"
    };

    std::vector<const LinkFault*> faultsOfLink() const;

    std::optional<LinkChange> link_;      // the last change
    std::deque<LinkFault> faults_;        // of links, the last few
    std::vector<std::uint64_t> lost_;     // numbers of the calls that ended with it, within a second
    std::int64_t lostAt_ = 0;             // when the first of them ended
    std::deque<std::int64_t> durations_;  // of the last answered calls
    std::deque<std::int64_t> lengthsSaid_;
    std::deque<Failure> failures_;
    std::map<std::uint8_t, std::int64_t> burstSaid_;  // by cause
};

}  // namespace calls

#endif
