// Counts what the figures of a trace are made of.
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

// Filters choose messages and calls. Channels count in full: a channel is no less in use because one looks at
// some calls alone. Derived classes that hear of messages, calls or findings call these in their own.
class FigureTaker : public Analysed {
  public:
    explicit FigureTaker(const Options& options) : Analysed(options) {}

    void flush() override {}
    // After the end of the trace, once.
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
