#include "app/Arrivals.h"

#include <memory>

namespace app {

Arrivals arrivals;

unsigned int Arrivals::arrive() {
    std::unique_lock guard(mutex_);
    room_.wait(guard, [this] { return closed_ || hasRoom(); });
    ++present_;
    return next_++;
}

void Arrivals::awaitTurn(unsigned int number) {
    std::unique_lock guard(mutex_);
    turns_[number % Slots].wait(guard, [&] { return closed_ || turn_ == number; });
}

void Arrivals::endTurn(unsigned int number) {
    const std::lock_guard guard(mutex_);
    endTurnLocked(number);
}

void Arrivals::endTurnLocked(unsigned int number) {
    const bool hadItsTurn = number - turn_ >= Slots;  // numbers behind the turn wrap to large distances
    if (closed_ || hadItsTurn)
        return;
    ended_[number % Slots] = true;
    if (number != turn_)
        return;
    while (ended_[turn_ % Slots])
        ended_[turn_++ % Slots] = false;
    turns_[turn_ % Slots].notify_one();
    room_.notify_one();
}

void Arrivals::leave(unsigned int number, bool delivered) {
    {
        const std::lock_guard guard(mutex_);
        lost_ += delivered || closed_ ? 0 : 1;
        endTurnLocked(number);
        if (--present_ == 0)
            none_.notify_all();
    }
    room_.notify_one();
}

unsigned long Arrivals::lost() const {
    const std::lock_guard guard(mutex_);
    return lost_;
}

bool Arrivals::awaitNone(std::chrono::milliseconds limit) {
    std::unique_lock guard(mutex_);
    return none_.wait_for(guard, limit, [this] { return present_ == 0; });
}

void Arrivals::close() {
    {
        const std::lock_guard guard(mutex_);
        closed_ = true;
    }
    room_.notify_all();
    for (std::condition_variable& turn : turns_)
        turn.notify_all();
}

void Arrivals::end() {
    traceEnded_ = true;
    close();
}

// What a board sends on after its trace was switched off is nobody's, and no news.
TracedCcs::~TracedCcs() {
    getMsgQueue()->unregisteredSource(
        [](vela::MsgQueue*, vela::Msg* msg) { const std::unique_ptr<vela::Msg> dropped(msg); });
    arrivals.end();
    endCallbacks();
}

vela::MsgBody* TracedCcs::EvtBodyLookup(unsigned int evtType) {
    if (evtType == EvtL2Trace_t::code)
        return std::make_unique<ArrivedRecord>().release();
    return CCS::EvtBodyLookup(evtType);
}

Turn::Turn(const vela::CCS::EvtL2Trace_t* rec) {
    const auto* const arrived = dynamic_cast<const ArrivedRecord*>(rec);
    if (arrived == nullptr)
        return;
    arrived->place.delivered();
    number_ = arrived->place.number();
    arrivals.awaitTurn(*number_);
}

Turn::~Turn() {
    if (number_)
        arrivals.endTurn(*number_);
}

}  // namespace app
