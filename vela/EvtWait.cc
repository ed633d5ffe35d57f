#include "vela/EvtWait.h"

namespace vela {

void Waiter::Timeout::toStream(std::ostream* out) const {
    const StreamFlags saved(*out);
    Exception::toStream(out);
    *out << std::hex << std::showbase << " Type: " << type_ << std::dec << " Timeout: " << timeoutMs_ << "ms";
}

void Waiter::enable(unsigned int type) {
    end();
    lock();
    type_ = type;
    state_ = Enabled;
    add(type);
}

void Waiter::disable() {
    if (State enabled = Enabled; state_.compare_exchange_strong(enabled, Idle)) {
        withdraw();
        unlock();
    }
    dispatcher_->awaitCallbacksOf(this);
}

void Waiter::end() {
    disable();
    handOnLateOne();
    awaited_.reset();
}

// If a message has arrived after the wait was given up, passes it on as one that comes after the first.
void Waiter::handOnLateOne() {
    if (Msg* const late = msg_.exchange(nullptr); late != nullptr)
        dispatcher_->receiveUnregistered(late);
}

// The callback. It runs on a delivery thread with the first message, unless the waiter was disabled
// meanwhile.
void Waiter::trigger(Addressable*, Msg* msg) {
    if (State enabled = Enabled; !state_.compare_exchange_strong(enabled, Triggered)) {
        dispatcher_->receiveUnregistered(msg);
        return;
    }
    withdraw();
    msg_ = msg;
    unlock();
}

// Ends the registration. It may have ended already: with the message that arrived, or because somebody has
// cancelled all registrations of the type.
void Waiter::withdraw() {
    try {
        remove(type_);
    } catch (const Exception&) {
    }
}

std::unique_ptr<Msg> Waiter::await(unsigned int timeoutMs) {
    if (awaited_ != nullptr)
        return std::move(awaited_);
    if (timeoutMs == 0)
        lock();
    else if (!tryLock(timeoutMs, 10))
        throwTimeout(type_, timeoutMs);
    std::unique_ptr<Msg> msg(msg_.exchange(nullptr));
    unlock();
    if (msg == nullptr)
        throwTimeout(type_, timeoutMs);
    state_ = Idle;
    return msg;
}

void Waiter::enableAndAwait(unsigned int type, unsigned int timeoutMs) {
    enable(type);
    awaited_ = await(timeoutMs);
}

Msg* Waiter::waitMsg(unsigned int timeoutMs) { return await(timeoutMs).release(); }

void Waiter::wait(MsgBody* body, unsigned int timeoutMs) {
    const std::unique_ptr<Msg> msg = await(timeoutMs);
    if (body != nullptr)
        msg->read(body, 0);
}

EvtCallback::MsgWait::MsgWait(EvtCallback* dispatcher, unsigned int type, unsigned int timeoutMs)
    : MsgWait(dispatcher) {
    enableAndAwait(type, timeoutMs);
}

void EvtCallback::MsgWait::add(unsigned int type) {
    dispatcher()->registerNextMsg(type, Handler(this, &MsgWait::trigger));
}

void EvtCallback::MsgWait::remove(unsigned int type) {
    dispatcher()->cancelMsgType(type, Handler(this, &MsgWait::trigger), 0);
}

EvtCallback::EvtWait::EvtWait(EvtCallback* dispatcher, unsigned int group, unsigned int timeoutMs)
    : EvtWait(dispatcher) {
    enableAndAwait(group, timeoutMs);
}

void EvtCallback::EvtWait::add(unsigned int group) {
    dispatcher()->registerNextEvt(group, Handler(this, &EvtWait::trigger));
}

void EvtCallback::EvtWait::remove(unsigned int group) {
    dispatcher()->cancelEvtGroup(group, Handler(this, &EvtWait::trigger), 0);
}

}  // namespace vela
