#include "fleet/ship/ShipMetrics.h"

#include <algorithm>
#include <chrono>

#include "fleet/metrics/Exposition.h"
#include "fleet/metrics/process.h"
#include "fleet/ship/Shipper.h"

namespace fleet {

namespace {

using Type = Exposition::Type;

constexpr double nanosecondsPerSecond = 1e9;

double secondsOf(std::int64_t nanoseconds) { return static_cast<double>(nanoseconds) / nanosecondsPerSecond; }

// Writes the figures of all parcels together.
void parcels(Exposition& to, const OutboxFigures& figures) {
    to.single("lapdship_parcels_sent_total", Type::counter, "Parcels sent, each time they were sent.",
              figures.sent);
    to.single("lapdship_octets_sent_total", Type::counter, "Octets of these parcels.", figures.octets);
    to.single("lapdship_parcels_kept_total", Type::counter, "Parcels that the stream has.", figures.kept);
    to.single("lapdship_parcels_duplicate_total", Type::counter, "Of these, parcels that it had before.",
              figures.duplicates);
    to.single("lapdship_parcels_refused_total", Type::counter,
              "Answers that say no; the parcel is sent again.", figures.refused);
    to.single("lapdship_parcels_unanswered_total", Type::counter,
              "Parcels that got no answer in time; they are sent again.", figures.unanswered);
    to.single("lapdship_stream_full", Type::gauge, "1 if the stream refuses parcels for want of room.",
              std::uint64_t{figures.isFull});
}

// Writes a sample for each D channel.
template <class ValueOf>
void eachTrunk(Exposition& to, const Shipper& shipper, const char* name, Type type, const char* help,
               ValueOf valueOf) {
    to.family(name, type, help);
    std::size_t number = 0;
    for (const ShippedTrunk& trunk : shipper.trunks()) {
        const ParcelHead& head = shipper.config().dChannels[number].head;
        to.sample({{"site", head.address.site},
                   {"trunk", trunk.name()},
                   {"name", head.trunk},
                   {"group", head.group}},
                  valueOf(trunk, number++));
    }
}

void newestFrames(Exposition& to, const Shipper& shipper) {
    to.family("lapdship_newest_frame_timestamp_seconds", Type::gauge,
              "When the newest frame was recorded; 0 if none was read.");
    std::size_t number = 0;
    for (const ShippedTrunk& trunk : shipper.trunks()) {
        const ParcelHead& head = shipper.config().dChannels[number++].head;
        for (const bool transmitted : {false, true})
            to.sample({{"site", head.address.site},
                       {"trunk", trunk.name()},
                       {"name", head.trunk},
                       {"group", head.group},
                       {"direction", transmitted ? "tx" : "rx"}},
                      secondsOf(trunk.newest(transmitted)));
    }
}

void trunks(Exposition& to, const Shipper& shipper) {
    const std::int64_t now = nanosecondsNow();
    eachTrunk(to, shipper, "lapdship_frames_total", Type::counter, "Frames read from recordings.",
              [](const ShippedTrunk& trunk, std::size_t) { return trunk.frames(); });
    eachTrunk(to, shipper, "lapdship_gaps_total", Type::counter,
              "How often frames are missing in the recordings for good.",
              [](const ShippedTrunk& trunk, std::size_t) { return trunk.gaps(); });
    newestFrames(to, shipper);
    eachTrunk(to, shipper, "lapdship_waiting_parcels", Type::gauge, "Parcels that are not known to be safe.",
              [&](const ShippedTrunk&, std::size_t number) {
                  return std::uint64_t{shipper.outbox().waiting(number)};
              });
    eachTrunk(to, shipper, "lapdship_lag_seconds", Type::gauge,
              "Age of the oldest frame that was read and is not known to be safe; 0 if there is none.",
              [&](const ShippedTrunk&, std::size_t number) {
                  const auto oldest = shipper.outbox().oldestWaiting(number);
                  return oldest ? std::max(0.0, secondsOf(now - *oldest)) : 0.0;
              });
}

void space(Exposition& to, const Shipper& shipper) {
    to.family("lapdship_disk_bytes", Type::gauge, "Size of the disk that a folder is on.");
    for (const auto& [folder, filling] : shipper.disks().disks())
        to.sample({{"folder", folder}}, filling.of);
    to.family("lapdship_disk_used_bytes", Type::gauge, "How much of it is used.");
    for (const auto& [folder, filling] : shipper.disks().disks())
        to.sample({{"folder", folder}}, filling.used);
    if (shipper.stream().octets == 0 && shipper.stream().mostOctets == 0)
        return;
    const std::string& stream = shipper.config().stream;
    to.family("lapdship_stream_used_bytes", Type::gauge, "Octets in the site's stream.");
    to.sample({{"stream", stream}}, shipper.stream().octets);
    to.family("lapdship_stream_bytes", Type::gauge, "Octets that it takes at most; 0 if it has no limit.");
    to.sample({{"stream", stream}}, shipper.stream().mostOctets);
}

}  // namespace

std::string metricsOf(const Shipper& shipper) {
    Exposition to;
    describeProcess(to, "lapdship", LAPDSHIP_VERSION);
    to.single("lapdship_turn_timestamp_seconds", Type::gauge, "When these figures were made.",
              secondsOf(nanosecondsNow()));
    to.single("lapdship_connected", Type::gauge, "1 while there is a connection to NATS.",
              std::uint64_t{shipper.isConnected()});
    parcels(to, shipper.figures());
    to.single("lapdship_returns_total", Type::counter,
              "How often frames were shipped again because the server may have lost them.",
              shipper.returns());
    trunks(to, shipper);
    space(to, shipper);
    return to.text();
}

}  // namespace fleet
