// Trace records from the moment they arrive to the moment they are gone: how many there may be, and in which
// order they are queued.
//
// Each event is delivered on a thread of its own, and threads overtake one another. A record therefore takes
// a place when it is made, on the dispatching thread, in the order of arrival; its delivery waits for its
// turn. There are as many places as the queue has room, so that no record is refused: when all are taken the
// dispatching thread waits, and with it whatever else arrives stays with the transport.
#ifndef APP_ARRIVALS_H
#define APP_ARRIVALS_H

#include <array>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <optional>

#include "vela/CCS.h"

namespace app {

class Arrivals {
  public:
    static constexpr unsigned int Most = 100;  // records at one time

    // Held by a record from arrival to destruction. One that is destroyed before its turn gives it away.
    class Place {
      public:
        explicit Place(Arrivals& arrivals) : arrivals_(arrivals), number_(arrivals.arrive()) {}
        ~Place() { arrivals_.leave(number_, delivered_); }
        Place(const Place&) = delete;
        Place& operator=(const Place&) = delete;

        unsigned int number() const { return number_; }
        // On the delivery's thread. A record that goes without it, found no thread or no memory, and is lost.
        void delivered() const { delivered_ = true; }

      private:
        Arrivals& arrivals_;
        unsigned int number_;
        mutable bool delivered_ = false;
    };

    void awaitTurn(unsigned int number);
    // The next may go; nothing if the number has had its turn.
    void endTurn(unsigned int number);

    // Until no record is there; false when `limit` has passed first.
    bool awaitNone(std::chrono::milliseconds limit);

    // Records that were lost before the end.
    unsigned long lost() const;

    // Nobody waits any more: places are unlimited and in no order. For the end of whoever shows records.
    void close();
    // The end of the trace: what arrives from now on, comes too late to be shown. Nobody waits any more.
    void end();
    bool ended() const { return traceEnded_; }

  private:
    static constexpr unsigned int Slots = 128;  // a power of two not below Most
    static_assert(Slots >= Most && (Slots & (Slots - 1)) == 0);

    unsigned int arrive();
    bool hasRoom() const { return present_ < Most && next_ - turn_ < Slots; }
    void leave(unsigned int number, bool delivered);
    void endTurnLocked(unsigned int number);

    mutable std::mutex mutex_;
    std::condition_variable room_;
    std::condition_variable none_;
    std::atomic<bool> traceEnded_ = false;
    bool closed_ = false;
    unsigned long lost_ = 0;
    unsigned int present_ = 0;
    unsigned int next_ = 0;                             // the number of the next to arrive; wraps
    unsigned int turn_ = 0;                             // the number whose turn it is
    std::array<bool, Slots> ended_{};                   // turns that ended before they came, by number
    std::array<std::condition_variable, Slots> turns_;  // one each, or every turn would wake everybody
};

extern Arrivals arrivals;

// A record with a place among the arrivals.
class ArrivedRecord : public vela::CCS::EvtL2Trace_t {
  public:
    Arrivals::Place place{arrivals};
};

// The traced D channel: its trace records are made as arrivals. Its callbacks have to end before it can, so
// that its end is the end of the arrivals as well.
class TracedCcs : public vela::CCS {
  public:
    using CCS::CCS;
    ~TracedCcs() override;

    vela::MsgBody* EvtBodyLookup(unsigned int evtType) override;
};

// The turn of a record that arrived; any other record has its turn at once. It may outlive the record.
class Turn {
  public:
    explicit Turn(const vela::CCS::EvtL2Trace_t* rec);
    ~Turn();
    Turn(const Turn&) = delete;
    Turn& operator=(const Turn&) = delete;

    // The record arrived, and the trace has ended meanwhile.
    bool isLate() const { return number_ && arrivals.ended(); }

  private:
    std::optional<unsigned int> number_;
};

}  // namespace app

#endif
