// Counts the figures of a trace.
#ifndef READER_FIGURETAKER_H
#define READER_FIGURETAKER_H

#include <cstdint>
#include <map>
#include <vector>

#include "calls/Figures.h"
#include "calls/LinkHistory.h"
#include "calls/Occupancy.h"
#include "reader/Analysed.h"
#include "reader/figureTables.h"
#include "reader/overTimeTables.h"

namespace reader {

// Filters choose messages and calls. Channels are always counted in full, because a channel is no less busy
// when the user looks at some calls only. A derived class that overrides one of the protected functions must
// call it from its own function.
class FigureTaker : public Analysed {
  public:
    explicit FigureTaker(const Options& options) : Analysed(options) {}

    void flush() override {}
    // After the end of the trace: what is still in use is in use until its end.
    void finish() { occupancy_.finish(analysis().spans()); }
    // The rest is about what finish() has left.
    std::vector<FigureTable> tables(calls::TrunkSize size) const {
        return figureTables(figures_, occupancy_, size);
    }
    std::vector<FigureTable> overTime() const { return overTimeTables(occupancy_, links_); }
    const calls::Figures& figures() const { return figures_; }
    const calls::LinkHistory& links() const { return links_; }

  protected:
    void see(const Seen& seen) override;
    void heard(const calls::Message& message, const calls::Call* call) override;
    void ended(const calls::Call& call) override { occupancy_.ended(call); }
    void gone(const calls::Call& call) override;
    void found(const calls::Finding& finding) override;

  private:
    calls::Figures figures_;
    std::map<std::uint64_t, calls::Figures::Messages> undecided_;  // by the number of a call that is alive
    calls::Occupancy occupancy_;
    calls::LinkHistory links_;
};

}  // namespace reader

#endif
