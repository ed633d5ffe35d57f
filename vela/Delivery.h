// One run of one callback: what it is called with, and what must not go before it.
#ifndef VELA_DELIVERY_H
#define VELA_DELIVERY_H

#include <cstddef>
#include <cstdint>
#include <memory>

#include "vela/Deliveries.h"
#include "vela/Handler.h"

namespace vela {

class Lane;

// Belongs to one thread at a time: to the dispatching one, then to its lane, then to the thread that runs it.
class Delivery {
  public:
    // Counts among `all` from now on.
    Delivery(const Handler& handler, Addressable* owner, unsigned int type, std::shared_ptr<Deliveries> all);
    ~Delivery();
    Delivery(const Delivery&) = delete;
    Delivery& operator=(const Delivery&) = delete;

    // Calls the callback, which owns the payload from then on. What escapes from it is reported; the
    // unwinding of a callback that ends its thread goes on.
    void run();

    // Octets of memory that it takes.
    std::size_t octets() const;

    // The payload: one of the two, by the handler's form.
    std::unique_ptr<MsgBody> body;
    std::unique_ptr<Msg> msg;
    // Its lane, which it keeps alive, the stack that its thread gets, and how many were lost right before it.
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
