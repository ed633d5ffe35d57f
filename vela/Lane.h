// The deliveries of one registration on their way to threads of their own.
#ifndef VELA_LANE_H
#define VELA_LANE_H

#include <cstddef>
#include <cstdint>
#include <deque>
#include <memory>
#include <mutex>

#include "vela/Delivery.h"
#include "vela/Thread.h"

namespace vela {

// So many deliveries are at work at a time, each on a thread of its own. The others wait in memory, in the
// order of arrival, and get their threads one by one as those before them end. Whoever dispatches never waits
// for a callback: a delivery that finds no room to wait is lost, and counted.
//
// Deliveries that run are numbered from 1 on, without gaps, in the order of arrival; the number, and how many
// were lost right before, stand in the body (MsgBody::arrival).
//
// Any thread may call it; its lock is held for a few statements and never while a callback or a stream is
// waited for. Deliveries share it: it may outlive whoever registered.
class Lane {
  public:
    struct Bounds {
        unsigned int atWork = 100;                    // deliveries that have a thread
        std::size_t waiting = 1000000;                // deliveries that have none yet,
        std::size_t octets = std::size_t{512} << 20;  // and the memory that they take
    };

    Lane() : Lane(Bounds()) {}
    explicit Lane(const Bounds& bounds) : bounds_(bounds) {}
    Lane(const Lane&) = delete;
    Lane& operator=(const Lane&) = delete;
    virtual ~Lane() = default;

    // Takes over a delivery, the next one that arrived. One thread at a time does so. Throws what making a
    // thread throws: then the delivery that was to have it is lost.
    void add(std::unique_ptr<Delivery> delivery);
    // The next one that arrived runs on this very thread, and never waits.
    void runHere(std::unique_ptr<Delivery> delivery);
    // The next one that arrived could not even be made.
    void lose();

    // From now on what is added is dropped without being counted.
    void close();
    bool isClosed() const;
    // Drops what waits; returns how many that were. They are not counted as lost, but what was lost between
    // them is missing() afterwards.
    std::uint64_t discardWaiting();

    std::uint64_t waiting() const;
    // Deliveries that wait or are at work.
    std::uint64_t pending() const;
    // Deliveries that got a thread so far: the number of the latest.
    std::uint64_t started() const;
    // Lost after the last one that waits or has started: no body says so yet.
    std::uint64_t missing() const;

    struct Losses {
        std::uint64_t noRoom = 0;   // too many waited
        std::uint64_t noMeans = 0;  // the system had no thread or no memory
        std::uint64_t all() const { return noRoom + noMeans; }
    };
    Losses losses() const;

  protected:
    // Gives threads to as many as may have one. For a lane whose alsoAtWork() has become less.
    void resume();

  private:
    // What counts as at work besides the deliveries; read under the lane's lock, so it may take none that is
    // held while a lane is called.
    virtual unsigned int alsoAtWork() const { return 0; }
    // The first of a run of deliveries is lost for want of room. On the dispatching thread.
    virtual void full() {}
    // So many were lost for want of room since it was said last. Called when none waits any more, on a
    // delivery's thread; by default the standard error stream says it.
    virtual void sayLost(std::uint64_t deliveries);

    struct Waiting {
        std::unique_ptr<Delivery> delivery;
        std::size_t octets;
    };
    using Lock = std::unique_lock<std::mutex>;

    static void* runOnThread(Thread::control* control, void* delivery);
    bool mayStart() const { return atWork_ + alsoAtWork() < bounds_.atWork; }
    bool hasRoomFor(std::size_t octets) const {
        return waiting_.size() < bounds_.waiting && octets <= bounds_.octets - octets_;
    }
    void refuse(Lock& lock);
    void number(Delivery& delivery);
    void startWaiting(Lock& lock);
    void startMore(Lock& lock);
    std::unique_ptr<Delivery> takeFirst();
    void noThreadFor(const Delivery& delivery);
    void ended();
    void sayWhatWasLost(Lock& lock);

    const Bounds bounds_;
    mutable std::mutex mutex_;
    std::deque<Waiting> waiting_;
    std::size_t octets_ = 0;  // of all that wait
    unsigned int atWork_ = 0;
    std::uint64_t started_ = 0;
    std::uint64_t missing_ = 0;
    std::uint64_t unsaid_ = 0;  // lost for want of room
    Losses losses_;
    bool starting_ = false;  // a thread is about it
    bool closed_ = false;
};

}  // namespace vela

#endif
