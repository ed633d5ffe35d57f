// Collects what is found out about the input, and hands it in updates to the thread that shows it.
#ifndef READER_BROWSE_COLLECTOR_H
#define READER_BROWSE_COLLECTOR_H

#include <chrono>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "calls/Occupancy.h"
#include "reader/Analysed.h"
#include "reader/browse/PerMinute.h"
#include "reader/browse/Update.h"

namespace reader::browse {

// Gives all items, and those calls and findings that `calls` and `check` show with the same options. Owns the
// names of D channels and files to which pages refer, so it must outlive all pages. Used by the thread that
// reads. Its functions throw UpdateQueue::Closed once the queue is closed.
class Collector : public Analysed {
  public:
    Collector(const Options& options, UpdateQueue& queue);

    bool countsItself() const override { return true; }
    void flush() override;
    // The input has ended, or cannot be read any further; `error` then says why. Hands the last update over.
    void finish(const std::string& error);

  private:
    using HostClock = std::chrono::steady_clock;

    // Of one D channel.
    struct Channel {
        PerMinute frames, calls;
        Instant when;
        std::int64_t at = 0;
        std::set<std::uint8_t> teis;
    };

    void see(const Seen& seen) override;
    void heard(const calls::Message& message, const calls::Call* call) override;
    void carried(const calls::Message& message, const calls::Call* call) override;
    void ended(const calls::Call& call) override;
    void gone(const calls::Call& call) override;
    void found(const calls::Finding& finding) override;
    void report(const calls::Finding& finding) override { update_.findings.push_back(finding); }

    bool mayBeShown(const calls::Call& call) const;
    void keep(const calls::Call& call);
    void noteFrame(const calls::Message& message, const calls::Call* call, bool isCarried);
    void handOver();
    void putOpenCalls();
    void putTrunks();
    std::vector<LinkView> linksOf(const std::string& name, const Channel& channel) const;
    const capture::Interface* known(const capture::Interface* interface);
    std::string_view known(std::string_view file);

    // The most items of an update.
    static constexpr std::size_t mostItems = 512;
    // The shortest time between two updates with the state of the trunks, while frames come.
    static constexpr std::chrono::milliseconds trunkInterval{100};

    UpdateQueue& queue_;
    calls::TrunkSize size_;
    calls::Occupancy occupancy_;
    std::map<std::string, Channel, std::less<>> channels_;
    std::deque<capture::Interface> interfaces_;
    std::set<std::string, std::less<>> files_;
    std::shared_ptr<Page> page_;
    Update update_;
    std::set<std::uint64_t> touched_;  // numbers of open calls that have changed since the last update
    std::uint64_t newestCall_ = 0;
    bool hasChanged_ = true;
    HostClock::time_point trunksAt_{};
};

}  // namespace reader::browse

#endif
