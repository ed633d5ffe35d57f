#include "fleet/store/Worker.h"

#include <algorithm>
#include <chrono>
#include <map>
#include <memory>
#include <pqxx/pqxx>
#include <thread>

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
            for (auto& [number, held] : held_) {
                if (stopped)
                    return;
                letters += moveOnce(held->inbox, held->partition, pause(), [](std::string_view) {});
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

    void leaseMore() {
        if (SteadyClock::now() < nextTry_)
            return;
        nextTry_ = SteadyClock::now() + betweenTries;
        std::string taken;
        for (const unsigned number : options_.partitions) {
            if (held_.contains(number) || !Lease(database_, number).isHeld())
                continue;
            auto held = std::make_unique<Held>(database_, nats_, number, options_.againAfter);
            if (!held->lease.isHeld())
                continue;
            held_[number] = std::move(held);
            taken += (taken.empty() ? "" : ", ") + std::to_string(number);
        }
        if (!taken.empty())
            say_("partitions leased: " + taken);
    }

    const WorkerOptions& options_;
    const Say& say_;
    pqxx::connection database_;
    NatsConnection nats_;
    std::map<unsigned, std::unique_ptr<Held>> held_;
    SteadyClock::time_point nextTry_{};
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
