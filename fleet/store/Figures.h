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

// What calls and findings of a D channel come to.
struct Outcomes {
    std::uint64_t calls = 0;                             // that have ended
    std::map<std::optional<int>, std::uint64_t> failed;  // of them, by cause; without one: none was given
    std::map<std::string_view, std::uint64_t> findings;  // by kind
    std::optional<bool> isLinkUp;                        // SAPI 0, TEI 0; nothing while it is not known

    // Adds up what is counted, and takes the newer state of the link.
    void add(const Outcomes& more);
};

struct TrunkFigures {
    int trunk = 0;  // its key in the store
    std::string site;
    std::string address;
    std::string name;
    std::string group;                     // NFAS, or empty
    std::uint64_t frames = 0;              // that came, also again
    std::uint64_t gaps = 0;                // how often frames are missing for good
    std::array<std::int64_t, 2> newest{};  // of frames received and sent: nanoseconds since 1970, or 0
    Outcomes outcomes;

    // Adds up what is counted, and takes what is newer of the rest.
    void add(const TrunkFigures& more);
};

// Of one partition since it was leased.
struct PartitionFigures {
    std::uint64_t frames = 0;   // rows that are new
    std::uint64_t doubles = 0;  // frames that were there already
    std::uint64_t calls = 0;    // rows written, also again
    std::uint64_t findings = 0;
    std::uint64_t deadLetters = 0;
    std::uint64_t holes = 0;               // runs that wait for a frame, just now
    std::int64_t lag = 0;                  // how long the newest letters waited in the stream, nanoseconds
    std::optional<std::uint64_t> waiting;  // letters in the stream
    std::map<std::string, TrunkFigures> trunks;  // by address
};

// What is known of the engines, besides.
struct EngineFigures {
    std::uint64_t databaseOctets = 0;
    std::uint64_t streamOctets = 0;
    std::uint64_t mostStreamOctets = 0;  // 0: no limit
};

// The newest figures of all that this lapdstore does. Used by any threads.
class StoreFigures {
  public:
    void set(unsigned partition, const PartitionFigures& figures);
    void setEngines(const EngineFigures& figures);
    // The partition is leased no more; its figures are those of somebody else now.
    void release(unsigned partition);
    // A worker has gone round; `worker` numbers them. False: it has no connections.
    void turned(unsigned worker, bool isConnected);

    // docs/user/fleet-metrics.md tells what each figure is.
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
