// A delivery: one event or message on its way to one callback.
#ifndef VELA_DELIVERY_H
#define VELA_DELIVERY_H

#include <cstddef>
#include <cstdint>
#include <memory>

#include "vela/Deliveries.h"
#include "vela/Handler.h"

namespace vela {

class Lane;

// It holds the arguments of the callback, and keeps alive what the callback needs. First the dispatching
// thread owns it, then its lane, then the thread that runs it.
class Delivery {
  public:
    // Registers itself with `all`, until its destructor.
    Delivery(const Handler& handler, Addressable* owner, unsigned int type, std::shared_ptr<Deliveries> all);
    ~Delivery();
    Delivery(const Delivery&) = delete;
    Delivery& operator=(const Delivery&) = delete;

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

  private:
    void call();

    Handler handler_;
    Addressable* owner_;
    unsigned int type_;
    std::shared_ptr<Deliveries> all_;
};

}  // namespace vela

#endif
