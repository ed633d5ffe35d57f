// Trace records from their arrival to their end: how many of them are on their way at a time, and in which
// order they are queued.
#ifndef APP_ARRIVALS_H
#define APP_ARRIVALS_H

#include <array>
#include <atomic>
#include <cstdint>
#include <memory>
#include <utility>

#include "vela/CCS.h"
#include "vela/Lane.h"

namespace app {

// Records that may be queued; and those that are queued, being shown or being delivered are together no more.
inline constexpr int QueueCapacity = 100;

// The lane of the trace events. Each is delivered on a thread of its own, and threads overtake one another: a
// record that comes before its turn is kept until those before it have come. A record counts as at work until
// it is destroyed, so that the queue has room for each one; the others wait in the lane.
class Arrivals : public vela::Lane {
  public:
    using Record = vela::CCS::EvtL2Trace_t;

    Arrivals() : Arrivals(Bounds()) {}
    explicit Arrivals(Bounds bounds);

    // On the delivery's thread, under queueGuard: gives the record to `queue`, in its turn, and then those
    // that have waited for it. One that no lane has numbered has its turn at once.
    template <typename Queue>
    void takeInTurn(std::unique_ptr<Record> rec, Queue queue) {
        ++taken_;
        if (const std::uint64_t number = rec->arrival().number; number != 0)
            early_[number % early_.size()] = std::move(rec);
        else
            queue(std::move(rec));
        while (std::unique_ptr<Record> due = std::move(early_[next_ % early_.size()])) {
            ++next_;
            queue(std::move(due));
        }
    }

    // A record that was taken is destroyed. Starts deliveries that have waited for its room, and so is called
    // without queueGuard.
    void gone();
    // A record found no memory in the queue and is destroyed. Under queueGuard.
    void refused();

    // Gives those that wait for their turn to `queue`, when no delivery runs any more: their turn will not
    // come.
    template <typename Queue>
    void releaseEarly(Queue queue) {
        for (std::unique_ptr<Record>& each : early_) {
            if (each != nullptr)
                queue(std::move(each));
        }
    }

    // Records that are waiting, being delivered, queued or being shown; 0 when all that arrived is written.
    std::uint64_t unwritten() const { return pending() + alsoAtWork(); }
    // Those that the system had no thread or no memory for.
    std::uint64_t lostForWantOfMeans() const { return losses().noMeans + refused_; }

  private:
    // Taken and not destroyed yet.
    unsigned int alsoAtWork() const override { return static_cast<unsigned int>(taken_ - gone_); }
    void full() override;
    void sayLost(std::uint64_t) override {}  // the log says where they are missing

    std::array<std::unique_ptr<Record>, QueueCapacity> early_;  // by number
    std::uint64_t next_ = 1;                                    // the number whose turn it is
    std::atomic<std::uint64_t> taken_ = 0;
    std::atomic<std::uint64_t> gone_ = 0;
    std::atomic<std::uint64_t> refused_ = 0;
    std::atomic<bool> fullSaid_ = false;
};

// Those of the trace; there for the whole process.
extern std::shared_ptr<Arrivals> arrivals;

// The traced D channel. Its callbacks have to end before it can, so its end is the end of the arrivals: what
// waits is dropped.
class TracedCcs : public vela::CCS {
  public:
    using CCS::CCS;
    ~TracedCcs() override;
};

}  // namespace app

#endif
