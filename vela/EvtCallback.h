// The dispatcher of one Addressable. It hands the events and messages that the board-side object sends
// unasked to the registered callbacks.
#ifndef VELA_EVTCALLBACK_H
#define VELA_EVTCALLBACK_H

#include <memory>
#include <utility>

#include "vela/AsyncMsgReceiver.h"
#include "vela/Deliveries.h"
#include "vela/Handler.h"
#include "vela/Lane.h"
#include "vela/Mutex.h"
#include "vela/linkedList.h"

namespace vela {

enum class Awaited { message, event };
template <Awaited what>
class Waiter;

class EvtCallback : public AsyncMsgReceiver {
  public:
    using Callback = CallbackBase;
    using MsgWait = Waiter<Awaited::message>;
    using EvtWait = Waiter<Awaited::event>;

    // The thread parameter of a callback that runs on the dispatching thread. That thread holds the
    // dispatcher's lock meanwhile and reads no further message, so the callback must not register, cancel,
    // wait for a reply or destroy the object. Any other thread parameter is the stack size, 0 for the
    // default, of the delivery's own thread, which it gets from the lane of its registration.
    static constexpr unsigned int onDispatchingThread = 0xFFFFFFFFU;

    explicit EvtCallback(Addressable* owner);
    // Calls end(). A callback on the dispatching thread must not destroy the dispatcher, because that thread
    // continues in the dispatcher afterwards.
    ~EvtCallback() override { end(); }

    // Stops receiving. Drops the messages that wait for the unregistered handlers, and says on the standard
    // error stream how many. Then waits until every other delivery has ended, also those in lanes, except for
    // one on this thread. The callbacks that it waits for may still register and cancel.
    void end();

    // Any thread may register; it waits for no callback. A callback that is registered twice runs twice. Each
    // registration has a lane, by default one of its own with the default bounds.
    void registerMsgType(unsigned int type, const Handler& callback, unsigned int threadParam);
    void registerEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam,
                          std::shared_ptr<Lane> lane = nullptr);
    // Registers for the first message of a type, or event of a group, that arrives. The registration ends
    // with that message.
    void registerNext(Awaited what, unsigned int key, const Handler& callback);

    // Remove one registration, or the key with all of them. Throw OutOfBoundsError when there is none.
    void cancelMsgType(unsigned int type, const Handler& callback, unsigned int threadParam);
    void cancelMsgType(unsigned int type);
    void cancelEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam);
    void cancelEvtGroup(unsigned int group);

    // Set the handler for messages and events without a registered callback. By default, and with an empty
    // handler, they are reported on the standard error stream and deleted. The handler must take the message:
    // throw Exception for one that takes a body.
    void unregisteredMsgType(const Handler& handler, unsigned int threadParam);
    void unregisteredEvtGroup(const Handler& handler, unsigned int threadParam);

    void receive(Msg* msg) override;

    // Gives a message to the handler for messages without a registered callback.
    void receiveUnregistered(Msg* msg);
    // Waits until no callback of this object runs any more, except one on this thread.
    void awaitCallbacksOf(const Callback* object) { deliveries_->awaitFor(object); }

  private:
    void enrolsItself() const override {}

    struct callbackInfo : virtualObject {
        callbackInfo(const Handler& callback, unsigned int parameter, std::shared_ptr<Lane> itsLane = nullptr,
                     bool forNextAlone = false)
            : handler(callback),
              threadParam(parameter),
              lane(itsLane == nullptr ? std::make_shared<Lane>() : std::move(itsLane)),
              once(forNextAlone) {}
        bool is(const Handler& callback, unsigned int parameter) const {
            return handler == callback && threadParam == parameter;
        }

        Handler handler;
        unsigned int threadParam;
        std::shared_ptr<Lane> lane;
        bool once;
    };
    using Table = keyedList<unsigned int, linkedList<callbackInfo>>;

    void add(Table& table, unsigned int key, const callbackInfo& callback);
    void remove(Table& table, unsigned int key, const Handler& callback, unsigned int threadParam);
    void remove(Table& table, unsigned int key);

    void dispatch(std::unique_ptr<Msg> msg);
    void dispatchTo(linkedList<callbackInfo>& callbacks, unsigned int key, bool isEvent,
                    std::unique_ptr<Msg> msg);
    void discardReports();
    void dispatchUnregistered(std::unique_ptr<Msg> msg);
    std::unique_ptr<Delivery> deliveryOf(const callbackInfo& to, Msg& msg, unsigned int key, bool isEvent,
                                         bool single);
    void run(const callbackInfo& to, std::unique_ptr<Delivery> delivery);
    std::unique_ptr<MsgBody> bodyOf(Msg& msg, unsigned int key, bool isEvent);

    Table msgTypes_;
    Table evtGroups_;
    Mutex mutex_;  // guards the tables and the defaults
    callbackInfo defaultMsg_;
    callbackInfo defaultEvt_;
    std::shared_ptr<Deliveries> deliveries_ = std::make_shared<Deliveries>();
};

}  // namespace vela

#endif
