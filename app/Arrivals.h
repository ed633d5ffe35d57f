// Keeps the trace records in their order, and limits how many are at work at a time.
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

// How many records the queue holds. Those that are delivered, queued and written at the same time are not
// more either.
inline constexpr int queueCapacity = 100;

// The lane of the trace events. Each event is delivered on a thread of its own, and threads overtake one
// another. So a record whose turn has not come is kept until those before it have come. A record counts as at
// work until it is destroyed; the others wait in the lane. So the queue always has room for the next record.
class Arrivals : public vela::Lane {
  public:
    using Record = vela::CCS::EvtL2Trace_t;

    Arrivals() : Arrivals(Bounds()) {}
    explicit Arrivals(const Bounds& bounds);

    // Calls queue(record) when it is the record's turn, and then for the records that have waited for this
    // one. A record without a number has its turn at once. Called on delivery threads, under queueGuard.
    template <typename Queue>
    void takeInTurn(std::unique_ptr<Record> rec, Queue queue) {
        ++taken_;
        if (const std::uint64_t number = rec->arrival().number; number != 0)
            early_[number % early_.size()] = std::move(rec);
        else
            queue(std::move(rec));
        while (std::unique_ptr<Record> due = std::move(early_[next_ % early_.size()])) {
            ++next_;
            tellOf(*due);
            queue(std::move(due));
        }
    }

    // Call it when a record that was taken has been destroyed. It starts deliveries that have waited for the
    // room, so the caller must not hold queueGuard.
    void gone();
    // Call it when the queue had no memory for a record, which the caller destroys. Called under queueGuard.
    void refused(const Record& rec);

    // Calls queue(record) for the records that still wait for their turn. Call it when no delivery runs any
    // more, because then their turn does not come.
    template <typename Queue>
    void releaseEarly(Queue queue) {
        for (std::unique_ptr<Record>& each : early_) {
            if (each != nullptr)
                queue(std::move(each));
        }
    }

    // How many records wait, are delivered, are queued or are being written; 0 when all that have arrived are
    // written.
    std::uint64_t unwritten() const { return pending() + alsoAtWork(); }
    // How many records were lost without a record that tells of them (MsgBody::arrival). Those that the queue
    // has refused are not counted. Call it when no delivery runs any more.
    std::uint64_t untold() const { return missing() + untold_; }
    // How many records were lost because the system had no thread or no memory.
    std::uint64_t lostForWantOfMeans() const { return losses().noMeans + refused_; }

  private:
    // The records that were taken and are not destroyed yet.
    unsigned int alsoAtWork() const override { return static_cast<unsigned int>(taken_ - gone_); }
    void full() override;
    void sayLost(std::uint64_t) override {}  // the log itself says where records are missing
    void tellOf(Record& rec);

    std::array<std::unique_ptr<Record>, queueCapacity> early_;  // records before their turn, by number
    std::uint64_t next_ = 1;                                    // the number whose turn it is
    std::uint64_t untold_ = 0;  // lost before a refused record: the next record that is queued tells of them
    std::atomic<std::uint64_t> taken_ = 0;
    std::atomic<std::uint64_t> gone_ = 0;
    std::atomic<std::uint64_t> refused_ = 0;
    std::atomic<bool> fullSaid_ = false;
};

// The arrivals of the trace. The object exists as long as the process.
extern std::shared_ptr<Arrivals> arrivals;

// The traced D channel. Its callbacks must end before it can be destroyed, so its destructor closes the
// arrivals and drops the records that still wait for a thread. quit() destroys it last, after the records
// have been written or counted as lost.
class TracedCcs : public vela::CCS {
  public:
    using CCS::CCS;
    ~TracedCcs() override;
};

}  // namespace app

#endif
