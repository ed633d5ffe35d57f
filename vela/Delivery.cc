#include "vela/Delivery.h"

#include <cxxabi.h>

#include <utility>

#include "vela/Exception.h"
#include "vela/report.h"

namespace vela {

void Delivery::begin(const Handler& handler, Addressable* owner, unsigned int type,
                     const std::shared_ptr<Deliveries>& all) {
    all->begin(handler.object());
    all_ = all;
    handler_ = handler;
    owner_ = owner;
    type_ = type;
}

void Delivery::end() {
    if (all_ == nullptr)
        return;
    body.reset();
    msg.reset();
    missing = 0;
    lane.reset();
    std::exchange(all_, nullptr)->end(handler_.object());
}

void Delivery::run() {
    try {
        call();
    } catch (const abi::__forced_unwind&) {  // the callback ends its thread, which is no error
        throw;
    } catch (const Exception& exception) {
        report(diagnostic(283, "VELA Exception caught from callback handler thread"), exception);
    } catch (...) {
        report(diagnostic(287, "genreal Exception caught from callback handler thread"));
    }
}

void Delivery::call() {
    const Deliveries::OnThisThread here(*all_, handler_.object());
    if (handler_.takesBody())
        handler_.call(owner_, type_, body.release());
    else
        handler_.call(owner_, msg.release());
}

// Adds up the delivery with its place in a lane, the body or message, and what the allocator needs for each
// block: the delivery, the body or handle, and the list or transport message.
std::size_t Delivery::octets() const {
    constexpr std::size_t besideEach = 16;
    std::size_t payload = 0;
    if (body != nullptr)
        payload = body->memorySize();
    else if (msg != nullptr)
        payload = sizeof(Msg) + sizeof(KSMsgRef) + sizeof(NvMsg32Bit) + msg->getSize();
    return sizeof(Delivery) + 2 * sizeof(std::size_t) + payload + 3 * besideEach;
}

}  // namespace vela
