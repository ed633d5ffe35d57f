// The figures of a lapdstore, for Prometheus.
#ifndef FLEET_STORE_FIGURES_H
#define FLEET_STORE_FIGURES_H

#include <array>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>

namespace fleet {

// Counts of the calls and findings of a D channel, and the state of its link.
struct Outcomes {
    std::uint64_t calls =
        0;  // that have ended; of a D channel of a group, not those that ended with its link
    // Of these, calls that failed, by cause. The key is empty for calls without a cause.
    std::map<std::optional<int>, std::uint64_t> failed;
    std::map<std::string_view, std::uint64_t> findings;  // by kind
    std::optional<bool> isLinkUp;                        // SAPI 0, TEI 0; nothing while it is not known

    // Adds the counts of `more`, and takes its state of the link if it has one.
    void add(const Outcomes& more);
};

struct TrunkFigures {
    int trunk = 0;  // its key in the store
    std::string site;
    std::string address;
    std::string name;
    std::string group;                     // NFAS, or empty
    std::uint64_t frames = 0;              // frames that came; one that came twice counts twice
    std::uint64_t gaps = 0;                // how often frames are missing for good
    std::array<std::int64_t, 2> newest{};  // of frames received and sent: nanoseconds since 1970, or 0
    Outcomes outcomes;

    // Adds the counts of `more`, and takes the newer of all other values.
    void add(const TrunkFigures& more);
};

// Figures of one partition since it was leased. A letter is a message of the stream (Inbox.h).
struct PartitionFigures {
    std::uint64_t frames = 0;   // frames that were stored
    std::uint64_t doubles = 0;  // frames that were dropped because the store had them
    std::uint64_t calls = 0;    // rows written; one that is replaced counts again
    std::uint64_t findings = 0;
    std::uint64_t deadLetters = 0;
    std::uint64_t holes = 0;               // runs that wait for a frame now
    std::int64_t lag = 0;                  // how long the newest letters waited in the stream, nanoseconds
    std::optional<std::uint64_t> waiting;  // letters that wait in the stream; empty if it was not asked yet
    std::map<std::string, TrunkFigures> trunks;  // by address; all that the store knows
};

// Figures of PostgreSQL and of the stream.
struct EngineFigures {
    std::uint64_t databaseOctets = 0;
    std::uint64_t streamOctets = 0;
    std::uint64_t mostStreamOctets = 0;  // 0: no limit
};

// The newest figures of all workers of this lapdstore. Any thread may call any function; a lock guards the
// figures.
class StoreFigures {
  public:
    void set(unsigned partition, const PartitionFigures& figures);
    void setEngines(const EngineFigures& figures);
    // The partition is not leased any more. Drops its figures, which another lapdstore may give from now on.
    void release(unsigned partition);
    // The worker with this number has gone through its partitions once, or has no connections.
    void turned(unsigned worker, bool isConnected);

    // docs/user/fleet-metrics.md says what each figure means.
    std::string text() const;

  private:
    struct Turn {
        std::int64_t at = 0;
        bool isConnected = false;
    };
    using Partitions = std::map<unsigned, std::shared_ptr<const PartitionFigures>>;

    mutable std::mutex lock_;
    Partitions partitions_;
    std::map<unsigned, Turn> turns_;
    std::optional<EngineFigures> engines_;
};

}  // namespace fleet

#endif
