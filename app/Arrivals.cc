#include "app/Arrivals.h"

#include <iostream>

namespace app {

std::shared_ptr<Arrivals> arrivals = std::make_shared<Arrivals>();

namespace {

vela::Lane::Bounds forTheQueue(vela::Lane::Bounds bounds) {
    bounds.atWork = QueueCapacity;
    return bounds;
}

}  // namespace

Arrivals::Arrivals(Bounds bounds) : Lane(forTheQueue(bounds)) {}

void Arrivals::gone() {
    ++gone_;
    resume();
}

// Its delivery, which is about to end, starts what has waited for the room.
void Arrivals::refused() {
    ++refused_;
    ++gone_;
}

void Arrivals::full() {
    if (!fullSaid_.exchange(true))
        std::cerr << "lapdmon: too many frames wait for the log, the next ones are lost\n" << std::flush;
}

// What a board sends on after its trace was switched off is nobody's, and no news.
TracedCcs::~TracedCcs() {
    getMsgQueue()->unregisteredSource(
        [](vela::MsgQueue*, vela::Msg* msg) { const std::unique_ptr<vela::Msg> dropped(msg); });
    arrivals->close();
    arrivals->discardWaiting();
    endCallbacks();
}

}  // namespace app
