// Feeds the items of a run to the analysis of calls. Commands about calls derive from it.
#ifndef READER_ANALYSED_H
#define READER_ANALYSED_H

#include <cstdint>
#include <deque>
#include <set>

#include "calls/Analysis.h"
#include "reader/Options.h"
#include "reader/Pipeline.h"

namespace reader {

// What the command line asks of an analysis.
calls::Options analysisOptions(const Options& options);
// Tells the analysis what the recorder had to say between frames.
void tell(calls::Analysis& analysis, const capture::Item& item);

// The analysis sees every item, whatever the filters say. A call is wanted if one of its frames passes them,
// a finding if its frame or its call does.
class Analysed : public Consumer, protected calls::Listener {
  public:
    explicit Analysed(const Options& options);

    void take(Chunk& chunk, std::size_t count) final;
    bool wantsAll() const final { return true; }
    // The input has ended.
    void finish() { analysis_.finish(); }
    const calls::Analysis& analysis() const { return analysis_; }

  protected:
    bool isWanted(const calls::Call& call) const;
    bool isWanted(const calls::Finding& finding) const;
    bool isWanted(const calls::Message& message) const;
    // Derived classes that need messages call this in their own.
    void heard(const calls::Message& message, const calls::Call* call) override;
    void gone(const calls::Call& call) override;

  private:
    void look(const Seen& seen, bool passes);
    bool hasPassed(std::uint64_t frame) const;

    // Frames this far behind the newest one are forgotten; findings come soon after their frames.
    static constexpr std::size_t framesRemembered = 1'000'000;

    calls::Analysis analysis_;
    bool filtered_;
    std::deque<bool> passed_;         // of the last frames, the newest at the end
    std::uint64_t newest_ = 0;        // number of the frame at the end of `passed_`
    std::set<std::uint64_t> wanted_;  // numbers of calls that are alive
};

}  // namespace reader

#endif
