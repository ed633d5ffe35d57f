#include <mutex>
#include <utility>

#include "vela/Addressable.h"
#include "vela/EvtCallback.h"
#include "vela/EvtGroupOf.h"
#include "vela/MsgDefault.h"
#include "vela/report.h"

namespace vela {

namespace {

// Gives the message a body: the one that the owner's look-up finds, or its octets.
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
    report(bannerBegin, joined(what, key), joined("For ", owner), msg, advice, bannerEnd);
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

// The handler for messages without a registered callback: the default in place of an empty one.
Handler checked(const Handler& handler, Handler::MsgFunction otherwise) {
    if (handler.takesBody() && !handler.isEmpty())
        throw Exception("what nobody registered for has no body: the handler must take the message");
    return handler.isEmpty() ? Handler(otherwise) : handler;
}

}  // namespace

EvtCallback::EvtCallback(Addressable* owner)
    : AsyncMsgReceiver(owner),
      defaultMsg_{&reportUnregisteredMsgType, 0},
      defaultEvt_{&reportUnregisteredEvtGroup, 0} {
    enrol();
}

void EvtCallback::end() {
    leave();
    discardReports();
    deliveries_->awaitAll();
}

void EvtCallback::discardReports() {
    std::uint64_t dropped = 0;
    {
        const std::lock_guard guard(mutex_);
        dropped = defaultMsg_.lane->discardWaiting() + defaultEvt_.lane->discardWaiting();
    }
    if (dropped != 0)
        report(joined("reports that still waited at the end, lost: ", dropped));
}

void EvtCallback::registerMsgType(unsigned int type, const Handler& callback, unsigned int threadParam) {
    add(msgTypes_, type, {callback, threadParam});
}

void EvtCallback::registerEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam,
                                   std::shared_ptr<Lane> lane) {
    add(evtGroups_, group, {callback, threadParam, std::move(lane)});
}

void EvtCallback::registerNext(Awaited what, unsigned int key, const Handler& callback) {
    add(what == Awaited::message ? msgTypes_ : evtGroups_, key, {callback, 0, nullptr, true});
}

void EvtCallback::cancelMsgType(unsigned int type, const Handler& callback, unsigned int threadParam) {
    remove(msgTypes_, type, callback, threadParam);
}

void EvtCallback::cancelMsgType(unsigned int type) { remove(msgTypes_, type); }

void EvtCallback::cancelEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam) {
    remove(evtGroups_, group, callback, threadParam);
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

void EvtCallback::remove(Table& table, unsigned int key, const Handler& callback, unsigned int threadParam) {
    const std::lock_guard guard(mutex_);
    linkedList<callbackInfo>& callbacks = table.element(key);
    unsigned int i = 0;
    while (i < callbacks.length() && !callbacks.element(i).is(callback, threadParam))
        ++i;
    callbacks.remove(i < callbacks.length() ? i : noIndex);
}

void EvtCallback::remove(Table& table, unsigned int key) {
    const std::lock_guard guard(mutex_);
    table.unset(key);
}

void EvtCallback::receive(Msg* msg) {
    try {
        const std::lock_guard guard(mutex_);
        dispatch(std::unique_ptr<Msg>(msg));
    } catch (...) {
        reportInternalError();
        throw;
    }
}

void EvtCallback::receiveUnregistered(Msg* msg) {
    const std::lock_guard guard(mutex_);
    dispatchUnregistered(std::unique_ptr<Msg>(msg));
}

void EvtCallback::dispatch(std::unique_ptr<Msg> msg) {
    const unsigned int type = msg->getMsgType();
    const bool isEvent = type == evtDetected;
    const unsigned int key = isEvent ? evtGroupOf(*msg) : type;
    linkedList<callbackInfo>* const callbacks = (isEvent ? evtGroups_ : msgTypes_).find(key);
    if (callbacks == nullptr || callbacks->length() == 0)
        dispatchUnregistered(std::move(msg));
    else
        dispatchTo(*callbacks, key, isEvent, std::move(msg));
}

// If there is a single callback, and it takes messages, it gets the received message itself. Several
// callbacks get a copy each.
void EvtCallback::dispatchTo(linkedList<callbackInfo>& callbacks, unsigned int key, bool isEvent,
                             std::unique_ptr<Msg> msg) {
    const bool single = callbacks.length() == 1;
    for (unsigned int i = 0; i < callbacks.length();) {
        const callbackInfo& entry = callbacks.element(i);
        if (!entry.handler.isEmpty()) {
            std::unique_ptr<Delivery> delivery = deliveryOf(entry, *msg, key, isEvent, single);
            if (single && !entry.handler.takesBody())
                delivery->msg.swap(msg);
            run(entry, std::move(delivery));
        }
        if (entry.once)
            callbacks.remove(i);
        else
            ++i;
    }
}

void EvtCallback::dispatchUnregistered(std::unique_ptr<Msg> msg) {
    const unsigned int type = msg->getMsgType();
    const callbackInfo& handler = type == evtDetected ? defaultEvt_ : defaultMsg_;
    std::unique_ptr<Delivery> delivery = handler.lane->spare();
    delivery->begin(handler.handler, owner(), type, deliveries_);
    delivery->msg = std::move(msg);
    run(handler, std::move(delivery));
}

// Makes the delivery to one callback, with its body or a copy of the message. If it cannot be made, its lane
// counts it as lost.
std::unique_ptr<Delivery> EvtCallback::deliveryOf(const callbackInfo& to, Msg& msg, unsigned int key,
                                                  bool isEvent, bool single) {
    try {
        std::unique_ptr<Delivery> delivery = to.lane->spare();
        delivery->begin(to.handler, owner(), msg.getMsgType(), deliveries_);
        if (to.handler.takesBody())
            delivery->body = bodyOf(msg, key, isEvent);
        else if (!single)
            delivery->msg = std::make_unique<Msg>(msg);
        return delivery;
    } catch (...) {
        to.lane->lose();
        throw;
    }
}

std::unique_ptr<MsgBody> EvtCallback::bodyOf(Msg& msg, unsigned int key, bool isEvent) {
    std::unique_ptr<MsgBody> body(isEvent ? owner()->EvtBodyLookup(key) : owner()->MsgBodyLookup(key));
    msg.read(body.get(), 0);
    return body;
}

void EvtCallback::run(const callbackInfo& to, std::unique_ptr<Delivery> delivery) {
    if (to.threadParam == onDispatchingThread) {
        to.lane->runHere(std::move(delivery));
        return;
    }
    delivery->lane = to.lane;
    delivery->stackSize = to.threadParam;
    to.lane->add(std::move(delivery));
}

}  // namespace vela
