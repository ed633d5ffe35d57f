// A delivery: one event or message on its way to one callback.
#ifndef VELA_DELIVERY_H
#define VELA_DELIVERY_H

#include <cstddef>
#include <cstdint>
#include <memory>

#include "vela/Deliveries.h"
#include "vela/Handler.h"
#include "vela/Thread.h"

namespace vela {

class Lane;

// It holds the arguments of the callback, and keeps alive what the callback needs. First the dispatching
// thread owns it, then its lane, then the thread that runs it. After its end it can begin again for another
// message.
class Delivery {
  public:
    Delivery() = default;
    ~Delivery() { end(); }
    Delivery(const Delivery&) = delete;
    Delivery& operator=(const Delivery&) = delete;

    // Registers itself with `all`, until its end.
    void begin(const Handler& handler, Addressable* owner, unsigned int type,
               const std::shared_ptr<Deliveries>& all);
    // Lets go of the lane, and of the body or message if the callback did not get it.
    void end();

    // Calls the callback and gives it the body or message. Reports an exception that leaves the callback. If
    // the callback ends its thread, lets the unwinding go on.
    void run();

    // The memory that it takes, in octets.
    std::size_t octets() const;

    // One of the two is set, according to the form of the handler.
    std::unique_ptr<MsgBody> body;
    std::unique_ptr<Msg> msg;
    // The lane, which the delivery keeps alive; the stack size of the thread; how many deliveries were lost
    // directly before.
    std::shared_ptr<Lane> lane;
    unsigned int stackSize = 0;
    std::uint64_t missing = 0;
    // For the lane: what the thread is to run, and the next one in its list of deliveries that have ended.
    Thread::Errand errand{};
    std::unique_ptr<Delivery> next;

  private:
    void call();

    Handler handler_{Handler::MsgFunction(nullptr)};
    Addressable* owner_ = nullptr;
    unsigned int type_ = 0;
    std::shared_ptr<Deliveries> all_;  // null before begin and after end
};

}  // namespace vela

#endif
