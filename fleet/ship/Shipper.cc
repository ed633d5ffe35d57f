#include "fleet/ship/Shipper.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/file.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <set>
#include <stdexcept>
#include <utility>

#include "fleet/ship/ShipMetrics.h"

namespace fleet {

namespace {

using namespace std::chrono_literals;

constexpr auto glance = 20ms;  // how often inputs are asked again that had nothing to give
constexpr auto betweenAttempts = 1s;
constexpr auto betweenFigures = 1s;

// Waits for this time. A signal ends the wait early.
void pauseFor(std::chrono::milliseconds time) {
    static_cast<void>(poll(nullptr, 0, static_cast<int>(time.count())));
}

int lockFolder(const std::string& folder) {
    const std::string path = folder + "/lock";
    const int lock = open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0666);
    if (lock < 0)
        throw std::runtime_error("cannot use " + folder + ": " + std::strerror(errno));
    if (flock(lock, LOCK_EX | LOCK_NB) == 0)
        return lock;
    close(lock);
    throw std::runtime_error("another lapdship uses " + folder);
}

std::optional<redaction::Key> keyOf(const ShipConfig& config) {
    if (!config.redact)
        return std::nullopt;
    std::optional<redaction::Key> key = redaction::readKey(*config.redact);
    if (!key)
        throw redaction::KeyError(*config.redact + ": there is no such key file; lapdread redact makes one");
    return key;
}

}  // namespace

Shipper::Shipper(const ShipConfig& config, const ShipperRules& rules, Say say)
    : config_(config),
      rules_(rules),
      say_(std::move(say)),
      lock_(lockFolder(config.state)),
      outbox_(rules.outbox, [this](std::size_t dChannel,
                                   const SafeUpTo& upTo) { trunks_[dChannel].safe(upTo, Clock::now()); }),
      doubt_(config.state + "/server", rules.calm),
      disks_(config.leastFree, say_) {
    const std::optional<redaction::Key> key = keyOf(config_);
    for (const ShippedDChannel& each : config_.dChannels)
        trunks_.emplace_back(each, trunks_.size(), config_.state, key ? &*key : nullptr, say_);
    if (config_.metrics.empty())
        return;
    answerer_ = std::make_unique<HttpAnswerer>(config_.metrics, [this] { return metrics_.get(); });
    publish();
    say_("figures are at http://" + answerer_->address() + "/metrics");
}

Shipper::~Shipper() { close(lock_); }

void Shipper::run(const std::atomic<bool>& stop) {
    while (!stop) {
        turn();
        reconsider();
    }
    finish();
}

void Shipper::drain(const std::atomic<bool>& stop) {
    const auto isHolding = [](const ShippedTrunk& trunk) { return trunk.isHolding(); };
    while (!stop && (turn() || !outbox_.isEmpty() || std::ranges::any_of(trunks_, isHolding))) {
    }
    if (!stop)
        settle(Clock::now());
    nextPlaces_ = {};
    savePlaces();
}

// Reads, sends and takes answers once. Returns false if there was nothing to read.
bool Shipper::turn() {
    const bool hasRead = readSome();
    try {
        carry(hasRead ? 0ms : std::chrono::milliseconds(glance));
        watch();
    } catch (const NatsError& error) {
        if (error.reason == NatsError::Reason::refused && !hasConnected_)
            throw;
        if (said_.insert(error.what()).second)
            say_(error.what());
        publisher_.reset();
        connection_.reset();
        nextAttempt_ = Clock::now() + betweenAttempts;
    }
    savePlaces();
    publish();
    heartbeat_.beat();
    return hasRead;
}

bool Shipper::readSome() {
    bool hasRead = false;
    for (ShippedTrunk& trunk : trunks_)
        hasRead = trunk.step(outbox_) || hasRead;
    return hasRead;
}

void Shipper::carry(std::chrono::milliseconds wait) {
    if (!connection_)
        connect();
    sayConnection();
    if (isConnected()) {
        outbox_.pump(*publisher_, wait);
        sayRefusal();
    } else {
        pauseFor(wait);
    }
}

void Shipper::connect() {
    if (Clock::now() < nextAttempt_)
        return;
    connection_ = std::make_unique<NatsConnection>(config_.nats);
    publisher_ = std::make_unique<NatsPublisher>(*connection_);
    hasConnected_ = true;
}

// Says when the connection is made or lost. Nothing is sent without one, because the library would keep it.
// After a new one all parcels that are not confirmed are sent again.
void Shipper::sayConnection() {
    const bool isNow = isConnected();
    if (std::exchange(wasConnected_, isNow) == isNow)
        return;
    said_.clear();
    say_(isNow ? "connected to " + connection_->server() : std::string("the connection is lost"));
    if (isNow)
        outbox_.sendAllAgain();
}

void Shipper::sayRefusal() {
    const std::string& refusal = outbox_.figures().refusal;
    if (std::exchange(saidRefusal_, refusal) == refusal)
        return;
    say_(refusal.empty() ? "the stream takes frames again"
                         : "the stream takes no frames: " + refusal + "; they stay in their recordings");
}

void Shipper::watch() {
    if (Clock::now() < nextWatch_)
        return;
    nextWatch_ = Clock::now() + rules_.betweenWatches;
    std::set<std::string> folders{config_.state};
    for (const ShippedDChannel& each : config_.dChannels) {
        if (!each.folder.empty())
            folders.insert(each.folder);
    }
    for (const std::string& folder : folders)
        disks_.look(folder);
    if (!mayAskStream_ || !isConnected())
        return;
    try {
        stream_ = fillingOf(*connection_, config_.stream);
        disks_.look("the stream " + config_.stream, stream_.octets, stream_.mostOctets);
    } catch (const NatsError& error) {
        say_(std::string(error.what()) + "; its filling is not watched");
        mayAskStream_ = false;
    }
}

// What the stream has confirmed is safe for good once the stream has taken something else a while later.
// Until then the places stay before it, also while nothing is sent and while there is no connection.
void Shipper::reconsider() {
    const Clock::time_point now = Clock::now();
    if (config_.resendWindow.count() == 0) {
        settle(now);
        return;
    }
    const OutboxFigures& figures = outbox_.figures();
    const std::uint64_t troubles = figures.failures + figures.forgotten;
    if (std::exchange(troubles_, troubles) != troubles)
        doubt_.raise(now);
    if (isConnected())
        doubt_.connectedTo(connection_->serverProcess(), now);
    if (!doubt_.exists())
        settle(outbox_.newestKept() - config_.resendWindow);
    else if (isConnected() && doubt_.isCalm(now))
        goBack();
}

// The server may say that it has parcels which it is about to lose, and a centre that fetches from it passes
// over numbers that it has seen before. So the parcels get new ids, and are stored behind all others.
void Shipper::goBack() {
    const auto second = std::chrono::system_clock::now().time_since_epoch() / 1s;
    outbox_.endIdsWith("~" + std::to_string(second));
    bool isAny = false;
    for (ShippedTrunk& trunk : trunks_)
        isAny = trunk.goBack(outbox_) || isAny;
    doubt_.end();
    if (!isAny)
        return;
    ++returns_;
    say_("the server was started anew or was in trouble; what it has confirmed lately is shipped again");
}

void Shipper::settle(Clock::time_point then) {
    for (ShippedTrunk& trunk : trunks_)
        trunk.settle(then);
}

void Shipper::savePlaces() {
    if (Clock::now() < nextPlaces_)
        return;
    nextPlaces_ = Clock::now() + rules_.betweenPlaces;
    for (ShippedTrunk& trunk : trunks_)
        trunk.save();
}

void Shipper::publish() {
    if (!answerer_ || Clock::now() < nextMetrics_)
        return;
    nextMetrics_ = Clock::now() + betweenFigures;
    metrics_.set(metricsOf(*this));
}

void Shipper::finish() {
    const auto until = Clock::now() + rules_.toFinish;
    try {
        while (isConnected() && !outbox_.isEmpty() && Clock::now() < until)
            outbox_.pump(*publisher_, glance);
    } catch (const NatsError& error) {
        say_(error.what());
    }
    nextPlaces_ = {};
    savePlaces();
}

}  // namespace fleet
