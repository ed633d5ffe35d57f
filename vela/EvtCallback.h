// The dispatcher of one Addressable: hands what the object sends unasked to whoever registered for it.
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

class EvtCallback : public AsyncMsgReceiver {
  public:
    using Callback = CallbackBase;
    class MsgWait;
    class EvtWait;

    // A thread parameter: run on the dispatching thread, which holds the dispatcher's lock meanwhile and
    // reads no further message: such a callback must not register, cancel, wait for a reply or destroy the
    // object. Any other value is the stack size, 0 for the default, of a thread of the delivery's own, which
    // it gets in its registration's lane.
    static constexpr unsigned int OnDispatchingThread = 0xFFFFFFFFU;

    explicit EvtCallback(Addressable* owner);
    // As end(). Not from a callback on the dispatching thread, which goes on in the dispatcher afterwards.
    ~EvtCallback() override { end(); }

    // Receives no more; returns when every delivery has ended, those that wait in their lanes too, but for
    // one on this thread itself. Those that it waits for may still register and cancel. Reports that wait are
    // dropped, and the standard error stream says how many.
    void end();

    // From any thread; waits for no callback. The same callback may be registered twice and then runs twice.
    // Each registration has a lane, by default one of its own with the usual bounds.
    void registerMsgType(unsigned int type, const Handler& callback, unsigned int threadParam);
    void registerEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam,
                          std::shared_ptr<Lane> lane = nullptr);
    // For the next message alone, the one that arrives first: with it the registration ends.
    void registerNextMsg(unsigned int type, const Handler& callback);
    void registerNextEvt(unsigned int group, const Handler& callback);

    // Remove one registration, or the key with all of them. Throw OutOfBoundsError when there is none.
    void cancelMsgType(unsigned int type, const Handler& callback, unsigned int threadParam);
    void cancelMsgType(unsigned int type);
    void cancelEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam);
    void cancelEvtGroup(unsigned int group);

    // What becomes of messages and events that nobody registered for; by default they are reported on the
    // standard error stream and deleted; an empty handler brings that back. Message form only: throw
    // Exception for a handler that takes a body.
    void unregisteredMsgType(const Handler& handler, unsigned int threadParam);
    void unregisteredEvtGroup(const Handler& handler, unsigned int threadParam);

    void receive(Msg* msg) override;

    // Gives a message to the handler for what nobody registered for.
    void receiveUnregistered(Msg* msg);
    // Returns when no callback of the object runs any more, but for one on this thread.
    void awaitCallbacksOf(const Callback* object) { deliveries_->awaitFor(object); }

  private:
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
