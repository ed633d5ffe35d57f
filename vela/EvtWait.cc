#include "vela/EvtWait.h"

#include <ostream>

#include "vela/StreamFlags.h"

namespace vela {

template <Awaited what>
void Waiter<what>::Timeout::toStream(std::ostream* out) const {
    const StreamFlags saved(*out);
    Exception::toStream(out);
    *out << std::hex << std::showbase << " Type: " << type_ << std::dec << " Timeout: " << timeoutMs_ << "ms";
}

template <Awaited what>
Waiter<what>::Waiter(EvtCallback* dispatcher, unsigned int type, unsigned int timeoutMs)
    : Waiter(dispatcher) {
    enable(type);
    awaited_ = await(timeoutMs);
}

template <Awaited what>
void Waiter<what>::enable(unsigned int type) {
    end();
    lock();
    type_ = type;
    state_ = enabled;
    dispatcher_->registerNext(what, type, Handler(this, &Waiter::trigger));
}

template <Awaited what>
void Waiter<what>::disable() {
    if (State expected = enabled; state_.compare_exchange_strong(expected, idle)) {
        withdraw();
        unlock();
    }
    dispatcher_->awaitCallbacksOf(this);
}

// If a message has arrived after the wait was given up, passes it on as one that comes after the first.
template <Awaited what>
void Waiter<what>::end() {
    disable();
    if (Msg* const late = msg_.exchange(nullptr); late != nullptr)
        dispatcher_->receiveUnregistered(late);
    awaited_.reset();
}

// The callback. It runs on a delivery thread with the first message, unless the waiter was disabled
// meanwhile.
template <Awaited what>
void Waiter<what>::trigger(Addressable*, Msg* msg) {
    if (State expected = enabled; !state_.compare_exchange_strong(expected, triggered)) {
        dispatcher_->receiveUnregistered(msg);
        return;
    }
    withdraw();
    msg_ = msg;
    unlock();
}

// Ends the registration. It may have ended already: with the message that arrived, or because somebody has
// cancelled all registrations of the type.
template <Awaited what>
void Waiter<what>::withdraw() {
    const Handler self(this, &Waiter::trigger);
    try {
        what == Awaited::message ? dispatcher_->cancelMsgType(type_, self, 0)
                                 : dispatcher_->cancelEvtGroup(type_, self, 0);
    } catch (const Exception&) {
    }
}

template <Awaited what>
std::unique_ptr<Msg> Waiter<what>::await(unsigned int timeoutMs) {
    if (awaited_ != nullptr)
        return std::move(awaited_);
    if (timeoutMs == 0)
        lock();
    else if (!tryLock(timeoutMs, 10))
        throw Timeout(type_, timeoutMs);
    std::unique_ptr<Msg> msg(msg_.exchange(nullptr));
    unlock();
    if (msg == nullptr)
        throw Timeout(type_, timeoutMs);
    state_ = idle;
    return msg;
}

template <Awaited what>
Msg* Waiter<what>::waitMsg(unsigned int timeoutMs) {
    return await(timeoutMs).release();
}

template <Awaited what>
void Waiter<what>::wait(MsgBody* body, unsigned int timeoutMs) {
    const std::unique_ptr<Msg> msg = await(timeoutMs);
    if (body != nullptr)
        msg->read(body, 0);
}

template class Waiter<Awaited::message>;
template class Waiter<Awaited::event>;

}  // namespace vela
