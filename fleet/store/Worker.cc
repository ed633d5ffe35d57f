#include "fleet/store/Worker.h"

#include <algorithm>
#include <chrono>
#include <map>
#include <memory>
#include <optional>
#include <pqxx/pqxx>
#include <set>
#include <thread>
#include <utility>

#include "fleet/inOneLine.h"
#include "fleet/store/Lease.h"
#include "fleet/store/NatsInbox.h"
#include "fleet/store/Partition.h"
#include "fleet/streams.h"

namespace fleet {

namespace {

using namespace std::chrono_literals;
using SteadyClock = std::chrono::steady_clock;

constexpr auto betweenTries = 2s;
constexpr auto beforeBeginningAnew = 1s;
constexpr auto betweenFigures = 1s;
constexpr auto betweenEngines = 60s;
constexpr auto afterNoAnswer = 5min;
constexpr auto moreToBeSure = 10s;
// All partitions of a thread are asked within this time, so nothing waits for longer.
constexpr std::chrono::milliseconds round = 200ms;
constexpr std::chrono::milliseconds shortest = 5ms;

// The two connections, and the leases that live as long as they do.
class Shift {
  public:
    // `troubles` are the kinds of trouble of the shifts before. It is emptied when this one has got further.
    Shift(const WorkerOptions& options, const Say& say, std::set<std::string>& troubles)
        : options_(options),
          say_(say),
          troubles_(troubles),
          database_(options.database),
          nats_(options.nats) {}
    ~Shift() {
        for (const auto& [number, held] : held_) {
            if (options_.figures != nullptr)
                options_.figures->release(number);
        }
    }
    Shift(const Shift&) = delete;
    Shift& operator=(const Shift&) = delete;

    void run(const std::atomic<bool>& stopped) {
        while (!stopped) {
            leaseMore();
            const auto begun = SteadyClock::now();
            std::size_t letters = 0;
            for (auto next = held_.begin(); next != held_.end() && !stopped;) {
                const auto at = next++;
                letters += move(at);
            }
            tellEngines();
            sayLeased(letters);
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
        SteadyClock::time_point nextFigures{};
        SteadyClock::time_point nextWaiting{};
    };

    std::chrono::milliseconds pause() const {
        return std::max(shortest, round / static_cast<int>(held_.size()));
    }

    // If the stream refuses a request of one partition, only that partition is given back, and leased again
    // later. If a connection is lost, all partitions are given back.
    std::size_t move(std::map<unsigned, std::unique_ptr<Held>>::iterator at) {
        const unsigned number = at->first;
        try {
            Held& held = *at->second;
            const std::size_t moved = moveOnce(held.inbox, held.partition, pause(), [](std::string_view) {});
            if (moved == 0)
                held.partition.sawNone();
            tell(number, held);
            return moved;
        } catch (const NatsError& error) {
            if (!nats_.isConnected())
                throw;
            held_.erase(at);
            if (options_.figures != nullptr)
                options_.figures->release(number);
            sayOf(number, error);
            return 0;
        }
    }

    // Hands out the figures of the partition once a second.
    void tell(unsigned number, Held& held) {
        const auto now = SteadyClock::now();
        if (now >= std::max(held.nextWaiting, mayAskFrom_)) {
            held.nextWaiting = now + options_.betweenQuestions;
            askWaiting(held);
        }
        if (options_.figures == nullptr || now < held.nextFigures)
            return;
        held.nextFigures = now + betweenFigures;
        options_.figures->set(number, held.partition.figures());
    }

    // Asks the server how many parcels wait. Only this answer tells that the consumer was deleted; a fetch
    // then merely gives none.
    void askWaiting(Held& held) {
        bool isThere = true;
        ask([&] {
            const std::optional<std::uint64_t> waiting = held.inbox.waiting();
            isThere = waiting.has_value();
            held.partition.sawWaiting(waiting.value_or(0));
        });
        if (!isThere)
            throw NatsError(NatsError::Reason::other, "its consumer was deleted, and is made anew");
    }

    void tellEngines() {
        if (options_.figures == nullptr)
            return;
        options_.figures->turned(options_.number, true);
        if (options_.number != 0 || SteadyClock::now() < std::max(nextEngines_, mayAskFrom_))
            return;
        nextEngines_ = SteadyClock::now() + betweenEngines;
        ask([&] {
            const StreamFilling stream = fillingOf(nats_, centreStream);
            pqxx::nontransaction work(database_);
            const auto octets =
                work.exec1("SELECT pg_database_size(current_database())")[0].as<std::uint64_t>();
            options_.figures->setEngines({octets, stream.octets, stream.mostOctets});
        });
    }

    // Asks a server something that can wait. If it does not answer, it is not asked again for a while, so
    // that the work is not held up.
    template <class Question>
    void ask(Question question) {
        try {
            question();
        } catch (const NatsError& error) {
            mayAskFrom_ = SteadyClock::now() + afterNoAnswer;
            if (std::exchange(saidNoAnswer_, error.what()) != error.what())
                say_(saidNoAnswer_ + "; figures of the stream are missing");
        }
    }

    // Tries to lease partitions. A try that fails may take as long as a request may take, so the next one is
    // made later, and the partitions that are held have their turn first.
    void leaseMore() {
        if (SteadyClock::now() < nextTry_)
            return;
        for (std::size_t i = 0; i < options_.partitions.size(); ++i) {
            const unsigned number = options_.partitions[firstToTry_];
            firstToTry_ = (firstToTry_ + 1) % options_.partitions.size();
            try {
                if (!held_.contains(number) && lease(number))
                    leased_ += (leased_.empty() ? "" : ", ") + std::to_string(number);
            } catch (const NatsError& error) {
                if (!nats_.isConnected())
                    throw;
                sayOf(number, error);
                break;
            }
        }
        nextTry_ = SteadyClock::now() + betweenTries;
    }

    // Says which partitions were leased. After a trouble it waits until letters were stored, or until the
    // letters that were not acknowledged must have come again: only then is it known whether the trouble is
    // over.
    void sayLeased(std::size_t letters) {
        if (!troubles_.empty() && letters == 0 &&
            SteadyClock::now() < begun_ + options_.againAfter + moreToBeSure)
            return;
        troubles_.clear();
        if (!leased_.empty())
            say_("partitions leased: " + std::exchange(leased_, {}));
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
    std::set<std::string>& troubles_;
    const SteadyClock::time_point begun_ = SteadyClock::now();
    std::string leased_;  // numbers of partitions, not said yet
    pqxx::connection database_;
    NatsConnection nats_;
    std::map<unsigned, std::unique_ptr<Held>> held_;
    std::map<unsigned, std::string> saidOf_;  // by partition: what was said of it last
    SteadyClock::time_point nextTry_{};
    std::size_t firstToTry_ = 0;  // index in the options
    SteadyClock::time_point nextEngines_{};
    SteadyClock::time_point mayAskFrom_{};
    std::string saidNoAnswer_;
};

// By what two errors count as the same. A server's texts name files and rows, which differ each time.
std::string kindOf(const std::exception& error) {
    const auto* const refused = dynamic_cast<const pqxx::sql_error*>(&error);
    return refused != nullptr && !refused->sqlstate().empty() ? refused->sqlstate() : error.what();
}

}  // namespace

void work(const WorkerOptions& options, const std::atomic<bool>& stopped, const Say& say) {
    std::set<std::string> troubles;
    while (!stopped) {
        try {
            Shift(options, say, troubles).run(stopped);
        } catch (const std::exception& error) {
            if (troubles.insert(kindOf(error)).second)
                say(inOneLine(error.what()));
            if (options.figures != nullptr)
                options.figures->turned(options.number, false);
            std::this_thread::sleep_for(beforeBeginningAnew);
        }
    }
}

}  // namespace fleet
