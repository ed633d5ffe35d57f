#include <cxxabi.h>

#include <mutex>
#include <utility>

#include "vela/Addressable.h"
#include "vela/EvtCallback.h"
#include "vela/EvtGroupOf.h"
#include "vela/MsgDefault.h"
#include "vela/report.h"

namespace vela {

namespace {

// The line numbers are part of the text.
std::string diagnostic(int line, const char* what) { return joined("(EvtCallback_Class", line, ") ", what); }

// The body that the owner knows for the message, else its octets.
template <typename LookUp>
void giveBody(Msg& msg, LookUp lookUp) {
    try {
        msg.setBodyDef(lookUp());
    } catch (const Exception&) {
        msg.setBodyDef(std::make_unique<MsgDefault_t>().release());
    }
}

void reportUnregistered(const Addressable& owner, const Msg& msg, const char* what, unsigned int key,
                        const char* advice) {
    report(BannerBegin, joined(what, key), joined("For ", owner), msg, advice, BannerEnd);
}

void reportUnregisteredMsgType(Addressable* owner, Msg* raw) {
    const std::unique_ptr<Msg> msg(raw);
    const unsigned int type = msg->getMsgType();
    giveBody(*msg, [&] { return owner->MsgBodyLookup(type); });
    reportUnregistered(*owner, *msg, "Unregisterd MsgType ", type,
                       "You may specify your own handler for unregisted messages using\n"
                       "Addressable::asyncUnregisteredMsgType");
}

void reportUnregisteredEvtGroup(Addressable* owner, Msg* raw) {
    const std::unique_ptr<Msg> msg(raw);
    const unsigned int group = evtGroupOf(*msg);
    giveBody(*msg, [&] { return owner->EvtBodyLookup(group); });
    reportUnregistered(*owner, *msg, "Unregisterd EventGroup ", group,
                       "You may specify your own handler for unregisted events using\n"
                       "Addressable::asyncUnregisteredEvtGroup");
}

// A handler for what nobody registered for: the default in place of an empty one.
Handler checked(const Handler& handler, Handler::MsgFunction otherwise) {
    if (handler.takesBody() && !handler.isEmpty())
        throw Exception("what nobody registered for has no body: the handler must take the message");
    return handler.isEmpty() ? Handler(otherwise) : handler;
}

}  // namespace

// One run of one callback. Until the callback has it, the payload is the delivery's.
struct EvtCallback::Delivery {
    Delivery(const Handler& callback, Addressable* object, unsigned int msgType,
             const std::shared_ptr<Deliveries>& all)
        : handler(callback),
          owner(object),
          type(msgType),
          deliveries(all),
          ticket(all->begin(handler.object())) {}
    ~Delivery() { deliveries->end(ticket); }
    Delivery(const Delivery&) = delete;
    Delivery& operator=(const Delivery&) = delete;

    void call() {
        const Deliveries::OnThisThread here(ticket);
        if (handler.takesBody())
            handler.call(owner, type, body.release());
        else
            handler.call(owner, msg.release());
    }

    Handler handler;
    Addressable* owner;
    unsigned int type;
    std::unique_ptr<MsgBody> body;
    std::unique_ptr<Msg> msg;
    std::shared_ptr<Deliveries> deliveries;
    Deliveries::Ticket ticket;
};

EvtCallback::EvtCallback(Addressable* owner)
    : AsyncMsgReceiver(owner),
      defaultMsg_{&reportUnregisteredMsgType, 0},
      defaultEvt_{&reportUnregisteredEvtGroup, 0} {
    enrol();
}

void EvtCallback::end() {
    leave();
    deliveries_->awaitAll();
}

void EvtCallback::registerMsgType(unsigned int type, const Handler& callback, unsigned int threadParam) {
    add(msgTypes_, type, {callback, threadParam});
}

void EvtCallback::registerEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam) {
    add(evtGroups_, group, {callback, threadParam});
}

void EvtCallback::cancelMsgType(unsigned int type, const Handler& callback, unsigned int threadParam) {
    remove(msgTypes_, type, {callback, threadParam});
}

void EvtCallback::cancelMsgType(unsigned int type) { remove(msgTypes_, type); }

void EvtCallback::cancelEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam) {
    remove(evtGroups_, group, {callback, threadParam});
}

void EvtCallback::cancelEvtGroup(unsigned int group) { remove(evtGroups_, group); }

void EvtCallback::unregisteredMsgType(const Handler& handler, unsigned int threadParam) {
    const callbackInfo chosen{checked(handler, &reportUnregisteredMsgType), threadParam};
    const std::lock_guard guard(mutex_);
    defaultMsg_ = chosen;
}

void EvtCallback::unregisteredEvtGroup(const Handler& handler, unsigned int threadParam) {
    const callbackInfo chosen{checked(handler, &reportUnregisteredEvtGroup), threadParam};
    const std::lock_guard guard(mutex_);
    defaultEvt_ = chosen;
}

void EvtCallback::add(Table& table, unsigned int key, const callbackInfo& callback) {
    const std::lock_guard guard(mutex_);
    if (table.find(key) == nullptr)
        table.set(key, {});
    table.element(key).append(callback);
}

void EvtCallback::remove(Table& table, unsigned int key, const callbackInfo& callback) {
    const std::lock_guard guard(mutex_);
    linkedList<callbackInfo>& callbacks = table.element(key);
    unsigned int i = 0;
    while (i < callbacks.length() && !(callbacks.element(i) == callback))
        ++i;
    callbacks.remove(i < callbacks.length() ? i : NoIndex);
}

void EvtCallback::remove(Table& table, unsigned int key) {
    const std::lock_guard guard(mutex_);
    table.unset(key);
}

void EvtCallback::receive(Msg* msg) {
    try {
        const std::lock_guard guard(mutex_);
        dispatch(std::unique_ptr<Msg>(msg));
    } catch (const Exception& exception) {
        report(diagnostic(214, "vela internal error"), exception);
        throw;
    } catch (...) {
        report(diagnostic(219, "vela internal error"));
        throw;
    }
}

void EvtCallback::receiveUnregistered(Msg* msg) {
    const std::lock_guard guard(mutex_);
    dispatchUnregistered(std::unique_ptr<Msg>(msg));
}

void EvtCallback::dispatch(std::unique_ptr<Msg> msg) {
    const unsigned int type = msg->getMsgType();
    const bool isEvent = type == EvtDetected;
    const unsigned int key = isEvent ? evtGroupOf(*msg) : type;
    linkedList<callbackInfo>* const callbacks = (isEvent ? evtGroups_ : msgTypes_).find(key);
    if (callbacks == nullptr || callbacks->length() == 0)
        dispatchUnregistered(std::move(msg));
    else
        dispatchTo(*callbacks, key, isEvent, std::move(msg));
}

// A single callback of message form gets the message itself, several get a copy each.
void EvtCallback::dispatchTo(linkedList<callbackInfo>& callbacks, unsigned int key, bool isEvent,
                             std::unique_ptr<Msg> msg) {
    const unsigned int type = msg->getMsgType();
    const bool single = callbacks.length() == 1;
    for (unsigned int i = 0; i < callbacks.length(); ++i) {
        const callbackInfo& entry = callbacks.element(i);
        if (entry.handler.isEmpty())
            continue;
        auto delivery = std::make_unique<Delivery>(entry.handler, owner(), type, deliveries_);
        if (entry.handler.takesBody())
            delivery->body = bodyOf(*msg, key, isEvent);
        else if (single)
            delivery->msg.swap(msg);
        else
            delivery->msg = std::make_unique<Msg>(*msg);
        run(std::move(delivery), entry.threadParam);
    }
}

void EvtCallback::dispatchUnregistered(std::unique_ptr<Msg> msg) {
    const unsigned int type = msg->getMsgType();
    const callbackInfo& handler = type == EvtDetected ? defaultEvt_ : defaultMsg_;
    auto delivery = std::make_unique<Delivery>(handler.handler, owner(), type, deliveries_);
    delivery->msg = std::move(msg);
    run(std::move(delivery), handler.threadParam);
}

std::unique_ptr<MsgBody> EvtCallback::bodyOf(Msg& msg, unsigned int key, bool isEvent) {
    std::unique_ptr<MsgBody> body(isEvent ? owner()->EvtBodyLookup(key) : owner()->MsgBodyLookup(key));
    msg.read(body.get(), 0);
    return body;
}

void EvtCallback::run(std::unique_ptr<Delivery> delivery, unsigned int threadParam) {
    if (threadParam == OnDispatchingThread) {
        start(nullptr, delivery.release());
        return;
    }
    AbandonedThread_create(&EvtCallback::start, delivery.get(), threadParam);
    static_cast<void>(delivery.release());  // the thread's now
}

void* EvtCallback::start(Thread::control*, void* arg) {
    const std::unique_ptr<Delivery> delivery(static_cast<Delivery*>(arg));
    try {
        delivery->call();
    } catch (const abi::__forced_unwind&) {  // the callback ends its thread: no error
        throw;
    } catch (const Exception& exception) {
        report(diagnostic(283, "VELA Exception caught from callback handler thread"), exception);
    } catch (...) {
        report(diagnostic(287, "genreal Exception caught from callback handler thread"));
    }
    return nullptr;
}

}  // namespace vela
