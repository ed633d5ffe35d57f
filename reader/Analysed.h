// The base of commands about calls: feeds the items of a run to the analysis of calls.
#ifndef READER_ANALYSED_H
#define READER_ANALYSED_H

#include <cstdint>
#include <deque>
#include <map>
#include <optional>
#include <set>
#include <vector>

#include "calls/Analysis.h"
#include "reader/CallFilter.h"
#include "reader/Options.h"
#include "reader/Pipeline.h"
#include "reader/session.h"

namespace reader {

// The analysis sees every item, whatever the filters say. A call is wanted if one of its frames passes the
// filters on frames and the call itself passes the filters on calls. A finding is wanted if its frame passes
// or its call is wanted.
class Analysed : public Consumer, protected calls::Listener {
  public:
    // A finding about a call waits for the end of the call if only that tells whether the call is wanted. At
    // most so many findings wait; then the oldest is dropped.
    static constexpr std::size_t mostFindingsHeld = 100'000;

    explicit Analysed(const Options& options);

    // Reads all inputs to their end. Says on the standard error stream what was dropped.
    void run(Session& session, Chatter& chatter);
    // What run() does at the end, for those who hand items in by take().
    void end(Chatter& chatter);

    void take(Chunk& chunk, std::size_t count) final;
    bool wantsAll() const final { return true; }
    void advance(std::int64_t nanoseconds) final { analysis_.advance(nanoseconds); }
    const calls::Analysis& analysis() const { return analysis_; }

  protected:
    bool isWanted(const calls::Call& call) const;
    // Whether a message is wanted. Empty while only the end of its call can tell.
    std::optional<bool> isWanted(const calls::Message& message, const calls::Call* call) const;
    // Whether a call that is alive may still be wanted by the filters on calls.
    bool mayBeWanted(const calls::Call& call) const { return callFilter_.wants(call.number).value_or(true); }
    // Whether one of the frames that have come of it passes the filters on frames.
    bool hasFrameWanted(const calls::Call& call) const { return !filtered_ || wanted_.contains(call.number); }
    // Is called for each finding that is wanted.
    virtual void report(const calls::Finding& /*finding*/) {}
    // Is called for each item, before the analysis takes it.
    virtual void see(const Seen& /*seen*/) {}
    // A derived class that overrides one of these must call it from its own function.
    void heard(const calls::Message& message, const calls::Call* call) override;
    void gone(const calls::Call& call) override;
    void found(const calls::Finding& finding) override;

  private:
    void look(const Seen& seen, bool passes);
    bool hasPassed(std::uint64_t frame) const;
    void hold(const calls::Finding& finding);

    // For how many of the newest frames it is remembered whether they passed the filters. Findings come soon
    // after their frames.
    static constexpr std::size_t framesRemembered = 1'000'000;
    // The same for calls that have gone, because a finding may name a call that was replaced.
    static constexpr std::size_t callsRemembered = 65'536;

    bool hasFrames_ = false;
    bool hasTimes_ = false;  // a time or ticks, of any frame
    CallFilter callFilter_;
    calls::Analysis analysis_;
    bool filtered_;
    std::deque<bool> passed_;                // of the last frames, the newest at the end
    std::uint64_t newest_ = 0;               // number of the frame at the end of `passed_`
    std::set<std::uint64_t> wanted_;         // numbers of calls that are alive
    std::map<std::uint64_t, bool> decided_;  // calls that have gone, and whether they were wanted
    std::deque<calls::Finding> held_;
    std::uint64_t letGo_ = 0;
    bool isAnyWanted_ = false;  // a call that has gone
};

}  // namespace reader

#endif
