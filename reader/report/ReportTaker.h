// Collects the contents of a report.
#ifndef READER_REPORT_REPORTTAKER_H
#define READER_REPORT_REPORTTAKER_H

#include <array>
#include <cstdint>
#include <optional>
#include <string>

#include "reader/CallLadder.h"
#include "reader/FigureTaker.h"
#include "reader/report/Page.h"

namespace reader {

// Collects the figures that `stats` shows, a row for each call and finding, and a ladder for each call that
// failed. Memory is bounded: pieces for which there is no room are counted.
class ReportTaker : public FigureTaker {
  public:
    // The most rows of calls that failed, and of other calls; rows of findings; ladders, and octets of
    // ladders.
    static constexpr std::uint64_t mostCalls = 20'000;
    static constexpr std::uint64_t mostFindings = 2'000;
    static constexpr std::uint64_t mostLadders = 500;
    static constexpr std::size_t mostLadderOctets = std::size_t{16} * 1024 * 1024;

    explicit ReportTaker(const Options& options);

    // After finish().
    Page page(std::string title, calls::TrunkSize size) const;

  private:
    void see(const Seen& seen) override;
    void heard(const calls::Message& message, const calls::Call* call) override;
    void carried(const calls::Message& message, const calls::Call* call) override;
    void gone(const calls::Call& call) override;
    void report(const calls::Finding& finding) override;

    void addCall(const calls::Call& call);
    // Whether there was room.
    bool addLadder(const calls::Call& call);

    bool filtered_;
    Ladders ladders_;
    TimeText times_;
    std::uint64_t frames_ = 0;
    std::optional<Instant> from_;
    Instant until_;
    std::uint64_t failed_ = 0;  // of the rows of calls
    Pieces callRows_{2 * mostCalls};
    Pieces ladderParts_{mostLadders, mostLadderOctets};
    Pieces findingRows_{mostFindings};
    std::array<std::uint64_t, 3> findings_{};  // by severity
    std::optional<calls::Finding> worst_;
};

}  // namespace reader

#endif
