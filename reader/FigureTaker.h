// Counts the figures of a trace.
#ifndef READER_FIGURETAKER_H
#define READER_FIGURETAKER_H

#include <cstdint>
#include <map>
#include <vector>

#include "calls/Figures.h"
#include "calls/Occupancy.h"
#include "reader/Analysed.h"
#include "reader/figureTables.h"

namespace reader {

// Filters choose messages and calls. Channels are always counted in full, because a channel is no less busy
// when the user looks at some calls only. A derived class that overrides one of the protected functions must
// call it from its own function.
class FigureTaker : public Analysed {
  public:
    explicit FigureTaker(const Options& options) : Analysed(options) {}

    void flush() override {}
    // The tables. Call this once, after the end of the trace.
    std::vector<FigureTable> tables(calls::TrunkSize size);
    const calls::Figures& figures() const { return figures_; }

  protected:
    void heard(const calls::Message& message, const calls::Call* call) override;
    void ended(const calls::Call& call) override { occupancy_.ended(call); }
    void gone(const calls::Call& call) override;
    void found(const calls::Finding& finding) override;

  private:
    calls::Figures figures_;
    std::map<std::uint64_t, calls::Figures::Messages> undecided_;  // by the number of a call that is alive
    calls::Occupancy occupancy_;
};

}  // namespace reader

#endif
