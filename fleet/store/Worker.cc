#include "fleet/store/Worker.h"

#include <algorithm>
#include <chrono>
#include <map>
#include <memory>
#include <pqxx/pqxx>
#include <thread>
#include <utility>

#include "fleet/store/Lease.h"
#include "fleet/store/NatsInbox.h"
#include "fleet/store/Partition.h"

namespace fleet {

namespace {

using namespace std::chrono_literals;
using SteadyClock = std::chrono::steady_clock;

constexpr auto betweenTries = 2s;
constexpr auto beforeBeginningAnew = 1s;
// All partitions of a thread are asked within this time, so nothing waits for longer.
constexpr std::chrono::milliseconds round = 200ms;
constexpr std::chrono::milliseconds shortest = 5ms;

// What is open as long as the two connections are.
class Shift {
  public:
    Shift(const WorkerOptions& options, const Say& say)
        : options_(options), say_(say), database_(options.database), nats_(options.nats) {}

    void run(const std::atomic<bool>& stopped) {
        while (!stopped) {
            leaseMore();
            const auto begun = SteadyClock::now();
            std::size_t letters = 0;
            for (auto next = held_.begin(); next != held_.end() && !stopped;) {
                const auto at = next++;
                letters += move(at);
            }
            if (letters == 0)
                std::this_thread::sleep_until(begun + (held_.empty() ? round : shortest));
        }
    }

  private:
    struct Held {
        Held(pqxx::connection_base& database, NatsConnection& nats, unsigned number,
             std::chrono::seconds againAfter)
            : lease(database, number), inbox(nats, number, againAfter), partition(database, number) {}
        Lease lease;
        NatsInbox inbox;
        Partition partition;
    };

    std::chrono::milliseconds pause() const {
        return std::max(shortest, round / static_cast<int>(held_.size()));
    }

    // What the stream refuses to one partition leaves the others alone: it is given back, and leased anew.
    // Without a connection everything is begun anew.
    std::size_t move(std::map<unsigned, std::unique_ptr<Held>>::iterator at) {
        const unsigned number = at->first;
        try {
            Held& held = *at->second;
            return moveOnce(held.inbox, held.partition, pause(), [](std::string_view) {});
        } catch (const NatsError& error) {
            if (!nats_.isConnected())
                throw;
            held_.erase(at);
            sayOf(number, error);
            return 0;
        }
    }

    // A try that fails may have taken as long as a request may take. So the next one waits for its turn, and
    // those that are held have theirs.
    void leaseMore() {
        if (SteadyClock::now() < nextTry_)
            return;
        std::string taken;
        for (std::size_t i = 0; i < options_.partitions.size(); ++i) {
            const unsigned number = options_.partitions[firstToTry_];
            firstToTry_ = (firstToTry_ + 1) % options_.partitions.size();
            try {
                if (!held_.contains(number) && lease(number))
                    taken += (taken.empty() ? "" : ", ") + std::to_string(number);
            } catch (const NatsError& error) {
                if (!nats_.isConnected())
                    throw;
                sayOf(number, error);
                break;
            }
        }
        nextTry_ = SteadyClock::now() + betweenTries;
        if (!taken.empty())
            say_("partitions leased: " + taken);
    }

    bool lease(unsigned number) {
        if (!Lease(database_, number).isHeld())
            return false;
        auto held = std::make_unique<Held>(database_, nats_, number, options_.againAfter);
        if (!held->lease.isHeld())
            return false;
        held_[number] = std::move(held);
        return true;
    }

    void sayOf(unsigned number, const NatsError& error) {
        const std::string why = error.what();
        if (std::exchange(saidOf_[number], why) != why)
            say_("partition " + std::to_string(number) + ": " + why);
    }

    const WorkerOptions& options_;
    const Say& say_;
    pqxx::connection database_;
    NatsConnection nats_;
    std::map<unsigned, std::unique_ptr<Held>> held_;
    std::map<unsigned, std::string> saidOf_;  // partitions
    SteadyClock::time_point nextTry_{};
    std::size_t firstToTry_ = 0;  // index in the options
};

}  // namespace

void work(const WorkerOptions& options, const std::atomic<bool>& stopped, const Say& say) {
    std::string saidLast;
    while (!stopped) {
        try {
            Shift(options, say).run(stopped);
            saidLast.clear();
        } catch (const std::exception& error) {
            std::string why = error.what();
            std::replace(why.begin(), why.end(), '\n', ' ');
            if (why != saidLast)
                say(why);
            saidLast = why;
            std::this_thread::sleep_for(beforeBeginningAnew);
        }
    }
}

}  // namespace fleet
