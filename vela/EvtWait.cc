#include "vela/EvtWait.h"

namespace vela {

void Waiter::Timeout::toStream(std::ostream* out) const {
    const StreamFlags saved(*out);
    Exception::toStream(out);
    *out << std::hex << std::showbase << " Type: " << type_ << std::dec << " Timeout: " << timeoutMs_ << "ms";
}

Waiter::~Waiter() { delete msg_.load(); }

void Waiter::enable(unsigned int type) {
    disable();
    lock();
    delete msg_.exchange(nullptr);
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

// On a delivery thread. A second message, on its way before the first one cancelled the registration, is
// nobody's.
void Waiter::trigger(Addressable*, Msg* msg) {
    if (State enabled = Enabled; !state_.compare_exchange_strong(enabled, Triggered)) {
        dispatcher_->receiveUnregistered(msg);
        return;
    }
    withdraw();
    msg_ = msg;
    unlock();
}

// Somebody may have cancelled everything for the type, this waiter with it.
void Waiter::withdraw() {
    try {
        remove(type_);
    } catch (const Exception&) {
    }
}

Msg* Waiter::waitMsg(unsigned int timeoutMs) {
    if (timeoutMs == 0)
        lock();
    else if (!tryLock(timeoutMs, 10))
        throwTimeout(type_, timeoutMs);
    Msg* const msg = msg_.exchange(nullptr);
    unlock();
    if (msg == nullptr)
        throwTimeout(type_, timeoutMs);
    state_ = Idle;
    return msg;
}

void Waiter::wait(MsgBody* body, unsigned int timeoutMs) {
    const std::unique_ptr<Msg> msg(waitMsg(timeoutMs));
    if (body != nullptr)
        msg->read(body, 0);
}

EvtCallback::MsgWait::MsgWait(EvtCallback* dispatcher, unsigned int type, unsigned int timeoutMs)
    : MsgWait(dispatcher) {
    enable(type);
    wait(nullptr, timeoutMs);
}

void EvtCallback::MsgWait::add(unsigned int type) {
    dispatcher()->registerMsgType(type, Handler(this, &MsgWait::trigger), 0);
}

void EvtCallback::MsgWait::remove(unsigned int type) {
    dispatcher()->cancelMsgType(type, Handler(this, &MsgWait::trigger), 0);
}

EvtCallback::EvtWait::EvtWait(EvtCallback* dispatcher, unsigned int group, unsigned int timeoutMs)
    : EvtWait(dispatcher) {
    enable(group);
    wait(nullptr, timeoutMs);
}

void EvtCallback::EvtWait::add(unsigned int group) {
    dispatcher()->registerEvtGroup(group, Handler(this, &EvtWait::trigger), 0);
}

void EvtCallback::EvtWait::remove(unsigned int group) {
    dispatcher()->cancelEvtGroup(group, Handler(this, &EvtWait::trigger), 0);
}

}  // namespace vela
