// A lane: gives the deliveries of one registration their threads.
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

// A limited number of deliveries is at work at a time, each on a thread of its own. The others wait in memory
// in the order of arrival and get their threads one by one as others end. The dispatching thread never waits
// for a callback: if there is no room for another delivery to wait, that delivery is lost and counted.
//
// The deliveries that get a thread are numbered from 1 on, without gaps, in the order of arrival. The body of
// each holds its number and how many deliveries were lost directly before it (MsgBody::arrival).
//
// Any thread may call any function. The lane's lock is held for a few statements, and never while a callback
// or a stream is waited for. The deliveries share the ownership of the lane, so it may outlive the
// registration.
class Lane {
  public:
    struct Bounds {
        unsigned int atWork = 100;                    // most deliveries that have a thread
        std::size_t waiting = 1000000;                // most deliveries that wait for one
        std::size_t octets = std::size_t{512} << 20;  // most memory that those which wait take
    };

    Lane() : Lane(Bounds()) {}
    explicit Lane(const Bounds& bounds) : bounds_(bounds) {}
    Lane(const Lane&) = delete;
    Lane& operator=(const Lane&) = delete;
    virtual ~Lane() = default;

    // Returns a delivery that has ended and can begin again, or a new one. So a thread that runs a delivery
    // neither allocates nor frees memory, which would cost such a short thread more than all its other work.
    std::unique_ptr<Delivery> spare();

    // These three are called in the order of arrival, by one thread at a time. add takes a delivery over,
    // which then gets a thread or waits. Throws Thread::CreationError when the system refuses the thread, and
    // std::bad_alloc; the delivery that was to get the thread is then lost and counted.
    void add(std::unique_ptr<Delivery> delivery);
    // Runs the delivery on the calling thread at once.
    void runHere(std::unique_ptr<Delivery> delivery);
    // Counts a delivery that could not be made as lost.
    void lose();

    // From now on deliveries that are added are dropped and not counted.
    void close();
    bool isClosed() const;
    // Drops the deliveries that wait and returns how many there were. They do not count as lost. Those that
    // were lost between them count in missing() afterwards.
    std::uint64_t discardWaiting();

    std::uint64_t waiting() const;
    // How many deliveries wait or are at work.
    std::uint64_t pending() const;
    // How many deliveries have got a thread so far, which is also the number of the latest.
    std::uint64_t started() const;
    // How many deliveries were lost after the last one that waits or has started. No body tells of them yet.
    std::uint64_t missing() const;

    struct Losses {
        std::uint64_t noRoom = 0;   // too many waited
        std::uint64_t noMeans = 0;  // the system had no thread or no memory
        std::uint64_t all() const { return noRoom + noMeans; }
    };
    Losses losses() const;

  protected:
    // Gives threads to as many deliveries as the bounds allow. A derived class calls it when its alsoAtWork()
    // has become less.
    void resume();

  private:
    // How many more count as at work, besides the deliveries. It is called under the lane's lock, so it must
    // not take a lock that is held while a function of the lane is called.
    virtual unsigned int alsoAtWork() const { return 0; }
    // Called on the dispatching thread when a delivery is lost because there is no room, but not again for
    // those that are lost directly after it.
    virtual void full() {}
    // Called on a delivery's thread when no delivery waits any more: so many were lost since the last call
    // because there was no room. By default it writes that to the standard error stream.
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
    void ended(std::unique_ptr<Delivery> delivery);
    void keep(std::unique_ptr<Delivery> delivery);
    void sayWhatWasLost(Lock& lock);

    const Bounds bounds_;
    mutable std::mutex mutex_;
    std::deque<Waiting> waiting_;
    std::size_t octets_ = 0;  // memory of the deliveries that wait
    std::unique_ptr<Delivery> spares_;
    unsigned int spareCount_ = 0;
    unsigned int atWork_ = 0;
    std::uint64_t started_ = 0;
    std::uint64_t missing_ = 0;
    std::uint64_t unsaid_ = 0;  // lost because there was no room, and not told to sayLost yet
    Losses losses_;
    bool starting_ = false;  // a thread is in startWaiting
    bool closed_ = false;
};

}  // namespace vela

#endif
