#include "app/Arrivals.h"

#include <iostream>
#include <utility>

namespace app {

std::shared_ptr<Arrivals> arrivals = std::make_shared<Arrivals>();

namespace {

vela::Lane::Bounds forTheQueue(vela::Lane::Bounds bounds) {
    bounds.atWork = queueCapacity;
    return bounds;
}

}  // namespace

Arrivals::Arrivals(const Bounds& bounds) : Lane(forTheQueue(bounds)) {}

void Arrivals::gone() {
    ++gone_;
    resume();
}

// Does not call resume(): the record's delivery is about to end, and its end starts those that have waited
// for the room.
void Arrivals::refused(const Record& rec) {
    untold_ += rec.arrival().missing;
    ++refused_;
    ++gone_;
}

void Arrivals::tellOf(Record& rec) {
    const vela::MsgBody::Arrival arrival = rec.arrival();
    rec.setArrival({arrival.number, arrival.missing + std::exchange(untold_, 0)});
}

void Arrivals::full() {
    if (!fullSaid_.exchange(true))
        std::cerr << "lapdmon: too many frames wait for the log, the next ones are lost\n" << std::flush;
}

// Messages that the board sends after its trace was switched off are dropped without a report.
TracedCcs::~TracedCcs() {
    getMsgQueue()->unregisteredSource(
        [](vela::MsgQueue*, vela::Msg* msg) { const std::unique_ptr<vela::Msg> dropped(msg); });
    arrivals->close();
    arrivals->discardWaiting();
    endCallbacks();
}

}  // namespace app
