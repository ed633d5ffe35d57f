#include "fleet/store/Figures.h"

#include <algorithm>
#include <utility>

#include "calls/FindingKinds.h"
#include "fleet/metrics/Exposition.h"
#include "fleet/metrics/process.h"

namespace fleet {

namespace {

using Type = Exposition::Type;
using Trunk = TrunkFigures;
using Partitions = std::map<unsigned, std::shared_ptr<const PartitionFigures>>;

constexpr double nanosecondsPerSecond = 1e9;

double secondsOf(std::int64_t nanoseconds) { return static_cast<double>(nanoseconds) / nanosecondsPerSecond; }

// Kinds that are worth an alert have a sample at 0 before anything was found: otherwise the first finding
// would make a new series, whose increase is 0.
constexpr const calls::FindingKind* watchedKinds[] = {
    &calls::findings::stuckChannel, &calls::findings::linkFlap, &calls::findings::causeBurst,
    &calls::findings::massClear, &calls::findings::doubleSeizure};

template <class ValueOf>
void eachPartition(Exposition& to, const Partitions& partitions, const char* name, Type type,
                   const char* help, ValueOf valueOf) {
    to.family(name, type, help);
    for (const auto& [number, figures] : partitions)
        to.sample({{"partition", std::to_string(number)}}, valueOf(*figures));
}

struct CountRow {
    const char* name;
    Type type;
    const char* help;
    std::uint64_t PartitionFigures::*count;
};
constexpr CountRow counts[] = {
    {"lapdstore_frames_total", Type::counter, "Frames stored.", &PartitionFigures::frames},
    {"lapdstore_frames_duplicate_total", Type::counter, "Frames dropped, since the store had them.",
     &PartitionFigures::doubles},
    {"lapdstore_dead_letters_total", Type::counter, "Parcels dropped into the stream of dead letters.",
     &PartitionFigures::deadLetters},
    {"lapdstore_waiting_runs", Type::gauge, "Runs whose calls wait for a frame that has not come.",
     &PartitionFigures::holes},
};

void partitionsAsText(Exposition& to, const Partitions& all) {
    using Figures = PartitionFigures;
    eachPartition(to, all, "lapdstore_partition_leased", Type::gauge, "1 for each partition leased.",
                  [](const Figures&) { return std::uint64_t{1}; });
    for (const CountRow& row : counts)
        eachPartition(to, all, row.name, row.type, row.help,
                      [&row](const Figures& figures) { return figures.*row.count; });
    eachPartition(to, all, "lapdstore_lag_seconds", Type::gauge,
                  "How long the parcels that were stored last had waited in the stream; 0 if none waits.",
                  [](const Figures& figures) { return secondsOf(figures.lag); });
    to.family("lapdstore_waiting_parcels", Type::gauge, "Parcels that wait in the stream.");
    for (const auto& [number, figures] : all) {
        if (figures->waiting)
            to.sample({{"partition", std::to_string(number)}}, *figures->waiting);
    }
}

// Calls put(trunk) for each D channel.
template <class Put>
void eachTrunk(Exposition& to, const Partitions& partitions, const char* name, Type type, const char* help,
               Put put) {
    to.family(name, type, help);
    for (const auto& [number, figures] : partitions) {
        for (const auto& [address, trunk] : figures->trunks)
            put(trunk);
    }
}

template <class Value>
void put(Exposition& to, const Trunk& trunk, Value value) {
    to.sample({{"site", trunk.site}, {"trunk", trunk.address}, {"name", trunk.name}, {"group", trunk.group}},
              value);
}

template <class Value>
void put(Exposition& to, const Trunk& trunk, std::string_view label, std::string_view text, Value value) {
    to.sample({{"site", trunk.site},
               {"trunk", trunk.address},
               {"name", trunk.name},
               {"group", trunk.group},
               {label, text}},
              value);
}

void putFindings(Exposition& to, const Trunk& trunk) {
    auto findings = trunk.outcomes.findings;
    for (const calls::FindingKind* const kind : watchedKinds)
        findings.try_emplace(kind->id, 0);
    for (const auto& [kind, count] : findings)
        put(to, trunk, "kind", kind, count);
}

void trunksAsText(Exposition& to, const Partitions& all) {
    eachTrunk(to, all, "lapdstore_trunk_frames_total", Type::counter, "Frames that came, also again.",
              [&](const Trunk& trunk) { put(to, trunk, trunk.frames); });
    eachTrunk(to, all, "lapdstore_trunk_gaps_total", Type::counter,
              "How often frames are missing for good, as the shipper says.",
              [&](const Trunk& trunk) { put(to, trunk, trunk.gaps); });
    eachTrunk(to, all, "lapdstore_newest_frame_timestamp_seconds", Type::gauge,
              "When the newest frame was recorded; 0 if none has come in this direction.",
              [&](const Trunk& trunk) {
                  if (trunk.newest == decltype(trunk.newest){})
                      return;  // nothing has come since the partition was leased
                  put(to, trunk, "direction", "rx", secondsOf(trunk.newest[0]));
                  put(to, trunk, "direction", "tx", secondsOf(trunk.newest[1]));
              });
    eachTrunk(to, all, "lapdstore_calls_total", Type::counter, "Calls that have ended.",
              [&](const Trunk& trunk) { put(to, trunk, trunk.outcomes.calls); });
    eachTrunk(to, all, "lapdstore_failed_calls_total", Type::counter,
              "Of these, calls that failed, by cause (Q.850); none if they had no cause.",
              [&](const Trunk& trunk) {
                  for (const auto& [cause, count] : trunk.outcomes.failed)
                      put(to, trunk, "cause", cause ? std::to_string(*cause) : "none", count);
              });
    eachTrunk(to, all, "lapdstore_findings_total", Type::counter, "Findings, by kind.",
              [&](const Trunk& trunk) { putFindings(to, trunk); });
    eachTrunk(to, all, "lapdstore_link_up", Type::gauge,
              "1 if the data link (TEI 0) is up, 0 if it is not; absent while that is not known.",
              [&](const Trunk& trunk) {
                  if (trunk.outcomes.isLinkUp)
                      put(to, trunk, std::uint64_t{*trunk.outcomes.isLinkUp});
              });
}

void enginesAsText(Exposition& to, const EngineFigures& engines) {
    to.single("lapdstore_database_bytes", Type::gauge, "Size of the database.", engines.databaseOctets);
    to.single("lapdstore_stream_used_bytes", Type::gauge, "Octets in the centre's stream.",
              engines.streamOctets);
    to.single("lapdstore_stream_bytes", Type::gauge, "Octets that it takes at most; 0 if it has no limit.",
              engines.mostStreamOctets);
}

}  // namespace

void Outcomes::add(const Outcomes& more) {
    calls += more.calls;
    for (const auto& [cause, count] : more.failed)
        failed[cause] += count;
    for (const auto& [kind, count] : more.findings)
        findings[kind] += count;
    isLinkUp = more.isLinkUp;
}

void TrunkFigures::add(const TrunkFigures& more) {
    trunk = more.trunk;
    site = more.site;
    address = more.address;
    name = more.name;
    group = more.group;
    frames += more.frames;
    gaps += more.gaps;
    for (std::size_t i = 0; i < newest.size(); ++i)
        newest[i] = std::max(newest[i], more.newest[i]);
    outcomes.add(more.outcomes);
}

void StoreFigures::set(unsigned partition, const PartitionFigures& figures) {
    auto copy = std::make_shared<const PartitionFigures>(figures);
    const std::lock_guard guard(lock_);
    partitions_[partition] = std::move(copy);
}

void StoreFigures::setEngines(const EngineFigures& figures) {
    const std::lock_guard guard(lock_);
    engines_ = figures;
}

void StoreFigures::release(unsigned partition) {
    const std::lock_guard guard(lock_);
    partitions_.erase(partition);
}

void StoreFigures::turned(unsigned worker, bool isConnected) {
    const std::lock_guard guard(lock_);
    turns_[worker] = {nanosecondsNow(), isConnected};
}

std::string StoreFigures::text() const {
    std::unique_lock guard(lock_);
    const Partitions partitions = partitions_;
    const auto turns = turns_;
    const auto engines = engines_;
    guard.unlock();
    Exposition to;
    describeProcess(to, "lapdstore", LAPDSTORE_VERSION);
    to.family("lapdstore_turn_timestamp_seconds", Type::gauge, "When a thread last went round.");
    for (const auto& [worker, turn] : turns)
        to.sample({{"thread", std::to_string(worker)}}, secondsOf(turn.at));
    to.family("lapdstore_connected", Type::gauge, "1 while a thread has its two connections.");
    for (const auto& [worker, turn] : turns)
        to.sample({{"thread", std::to_string(worker)}}, std::uint64_t{turn.isConnected});
    partitionsAsText(to, partitions);
    trunksAsText(to, partitions);
    if (engines)
        enginesAsText(to, *engines);
    return to.text();
}

}  // namespace fleet
