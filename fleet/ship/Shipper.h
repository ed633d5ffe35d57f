// All D channels of a host, shipped over one connection.
#ifndef FLEET_SHIP_SHIPPER_H
#define FLEET_SHIP_SHIPPER_H

#include <atomic>
#include <chrono>
#include <deque>
#include <memory>
#include <optional>
#include <set>
#include <string>

#include "fleet/Nats.h"
#include "fleet/NatsPublisher.h"
#include "fleet/metrics/HttpAnswerer.h"
#include "fleet/metrics/Published.h"
#include "fleet/ship/DiskWatch.h"
#include "fleet/ship/Doubt.h"
#include "fleet/ship/Outbox.h"
#include "fleet/ship/ShipConfig.h"
#include "fleet/ship/ShippedTrunk.h"
#include "fleet/streams.h"
#include "service/notify.h"

namespace fleet {

struct ShipperRules {
    OutboxRules outbox;
    std::chrono::milliseconds betweenPlaces{200};  // how often places are written to their files
    std::chrono::milliseconds toFinish{5000};      // how long the end waits for answers
    std::chrono::seconds betweenWatches{30};       // how often disks and the stream are looked at
    std::chrono::milliseconds calm{30'000};  // how long nothing may go wrong before the shipper goes back
};

// Runs on the caller's thread. Another thread hands out the figures (HttpAnswerer).
class Shipper {
  public:
    // Throws std::runtime_error if the state's folder cannot be used or another shipper uses it,
    // redaction::KeyError if the key is missing, and BadListenAddress if figures cannot be offered.
    Shipper(const ShipConfig& config, const ShipperRules& rules, Say say);
    ~Shipper();
    Shipper(const Shipper&) = delete;
    Shipper& operator=(const Shipper&) = delete;

    // Ships until `stop` is set, which a signal handler may do. Waits for a server that cannot be reached.
    // When the server may have lost what it confirmed, goes back to the places and ships it again.
    // Throws NatsError if the first server that is reached refuses the credentials.
    void run(const std::atomic<bool>& stop);
    // Ships what is there. Returns when the stream has confirmed all of it and there is nothing more to read,
    // or when `stop` is set. Never goes back, since it does not stay to see what the server does. Throws as
    // run() does.
    void drain(const std::atomic<bool>& stop);

    bool isConnected() const { return connection_ && connection_->isConnected(); }
    const ShipConfig& config() const { return config_; }
    const OutboxFigures& figures() const { return outbox_.figures(); }
    const Outbox& outbox() const { return outbox_; }
    const DiskWatch& disks() const { return disks_; }
    // How often it went back.
    std::uint64_t returns() const { return returns_; }
    // How full the site's stream was when it was asked last; all zero if it was never asked.
    const StreamFilling& stream() const { return stream_; }
    const std::deque<ShippedTrunk>& trunks() const { return trunks_; }

  private:
    using Clock = std::chrono::steady_clock;

    bool turn();
    bool readSome();
    void carry(std::chrono::milliseconds wait);
    void connect();
    void sayConnection();
    void sayRefusal();
    void watch();
    void reconsider();
    void goBack();
    void settle(Clock::time_point then);
    void savePlaces();
    void publish();
    void finish();

    ShipConfig config_;
    ShipperRules rules_;
    Say say_;
    int lock_ = -1;
    std::deque<ShippedTrunk> trunks_;
    Outbox outbox_;
    Doubt doubt_;
    std::uint64_t troubles_ = 0;  // how many of the troubles that the outbox counts have been considered
    std::uint64_t returns_ = 0;
    DiskWatch disks_;
    StreamFilling stream_;
    Published metrics_;  // made once a second, and handed out by the answerer's thread
    std::unique_ptr<HttpAnswerer> answerer_;
    service::Heartbeat heartbeat_;
    std::unique_ptr<NatsConnection> connection_;
    std::unique_ptr<NatsPublisher> publisher_;
    bool wasConnected_ = false;
    bool hasConnected_ = false;  // ever
    bool mayAskStream_ = true;
    std::set<std::string> said_;  // troubles of the server since there was a connection
    std::string saidRefusal_;
    Clock::time_point nextAttempt_{};
    Clock::time_point nextPlaces_{};
    Clock::time_point nextWatch_{};
    Clock::time_point nextMetrics_{};
};

}  // namespace fleet

#endif
