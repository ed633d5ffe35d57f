// The base class of every board-side object that the host talks to.
#ifndef VELA_ADDRESSABLE_H
#define VELA_ADDRESSABLE_H

#include <memory>
#include <mutex>
#include <optional>
#include <type_traits>
#include <typeinfo>

#include "vela/CompDesc.h"
#include "vela/EvtCallback.h"
#include "vela/EvtWait.h"
#include "vela/Exception.h"
#include "vela/Handler.h"
#include "vela/MsgQueue.h"

namespace vela {

class Addressable : public virtualObject {
  public:
    static constexpr unsigned int DefaultResponseTimeout = 5000;  // ms
    static constexpr unsigned int DefaultErrorWaitTime = 1000;    // ms

    // How long a command waits for its reply, in ms. Without a value it waits for the object's own time-out.
    using Wait = std::optional<unsigned int>;

    // A copy of the object's addresses for an exception, because the object may be gone when the exception is
    // printed.
    struct Identity {
        explicit Identity(const Addressable& object);
        CompDesc_t target;
        CompDesc_t host;
    };

    // There was no reply within the response time-out.
    class Timeout : public Exception {
      public:
        Timeout(const Addressable& object, unsigned int cmdMsgType, unsigned int retMsgType,
                unsigned int trans, unsigned int timeoutMs);
        unsigned int cmdMsgType() const { return cmdMsgType_; }
        unsigned int retMsgType() const { return retMsgType_; }
        unsigned int trans() const { return trans_; }
        unsigned int timeoutMs() const { return timeoutMs_; }
        void toStream(std::ostream* out) const override;

      private:
        Identity object_;
        unsigned int cmdMsgType_, retMsgType_, trans_, timeoutMs_;
    };

    // The reply was not the expected one; most often it is an error. Copies of the exception share the
    // message.
    class UnexpectedMsg : public Exception {
      public:
        UnexpectedMsg(const Addressable& object, unsigned int cmdMsgType, std::shared_ptr<Msg> msg);
        unsigned int cmdMsgType() const { return cmdMsgType_; }
        const std::shared_ptr<Msg>& msg() const { return msg_; }
        void toStream(std::ostream* out) const override;

      private:
        Identity object_;
        unsigned int cmdMsgType_;
        std::shared_ptr<Msg> msg_;
    };

    // There is no body class for a message type; for an event group.
    class UndefinedMsgBody : public Exception {
      public:
        explicit UndefinedMsgBody(unsigned int type)
            : Exception("vela::Addressable::UndefinedMsgBody"), type_(type) {}
        unsigned int type() const { return type_; }

      private:
        unsigned int type_;
    };
    class UndefinedEvtBody : public Exception {
      public:
        explicit UndefinedEvtBody(unsigned int type)
            : Exception("vela::Addressable::UndefinedEvtBody"), type_(type) {}
        unsigned int type() const { return type_; }

      private:
        unsigned int type_;
    };

    // If the queue is null, the object makes a private one.
    Addressable(const CompDesc_t& target, MsgQueue* queue);
    // A copy has the same address and queue, and the two time-outs as they are now. It has no callbacks.
    Addressable(const Addressable& other);
    explicit Addressable(const Addressable* other) : Addressable(*other) {}
    Addressable& operator=(const Addressable&) = delete;
    // Waits until the object's callbacks have ended. A callback on the dispatching thread must not destroy
    // the object.
    ~Addressable() override;

    // Moves the object and its registrations to this queue, or if it is null, to a private one.
    virtual void MsgQueueAttach(MsgQueue* queue);
    // Return a new empty body, which the caller owns. Throw UndefinedMsgBody, UndefinedEvtBody.
    virtual MsgBody* MsgBodyLookup(unsigned int msgType);
    virtual MsgBody* EvtBodyLookup(unsigned int evtType);

    MsgQueue* getMsgQueue() const { return queue_.get(); }
    CompDesc_t getTgtDesc() const { return target_; }
    unsigned int getObjId() const { return objId_; }
    unsigned int getResponseTimeout() const { return responseTimeout_; }
    unsigned int getErrorWaitTime() const { return errorWaitTime_; }
    // Set the time-outs in ms: for this object's requests from now on, and for objects that are copied from
    // it or found through it afterwards. Objects that exist keep theirs.
    virtual void setResponseTimeout(unsigned int ms) { responseTimeout_ = ms; }
    virtual void setErrorWaitTime(unsigned int ms) { errorWaitTime_ = ms; }

    // Sends cmd, waits for the reply, and reads it into ret unless that is null. If trans is 0, uses a new
    // transaction number. If flags is not 0, the reply may come from any source. Throws Timeout,
    // UnexpectedMsg, and KSMsgRef::AllocationError when the transport has no memory.
    void request(unsigned int msgType, MsgBody* cmd, unsigned int retMsgType, MsgBody* ret,
                 unsigned int trans = 0, int flags = 0);
    // Sends cmd, which has no reply, and waits for the error wait time. Throws UnexpectedMsg if any reply
    // comes.
    void request(unsigned int msgType, MsgBody* cmd, unsigned int trans = 0, int flags = 0);

    // Register callbacks by message type or by event group, and cancel registrations. EvtCallback.h describes
    // them.
    void asyncRegisterMsgType(unsigned int type, const Handler& callback, unsigned int threadParam);
    void asyncRegisterEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam,
                               std::shared_ptr<Lane> lane = nullptr);
    void asyncCancelMsgType(unsigned int type, const Handler& callback, unsigned int threadParam);
    void asyncCancelMsgType(unsigned int type);
    void asyncCancelEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam);
    void asyncCancelEvtGroup(unsigned int group);
    void asyncUnregisteredMsgType(const Handler& handler, unsigned int threadParam);
    void asyncUnregisteredEvtGroup(const Handler& handler, unsigned int threadParam);

    // The same with an object and its member function, which takes the body or the message.
    template <typename T, typename Member>
    void asyncRegisterMsgType(unsigned int type, T* object, Member member, unsigned int threadParam) {
        asyncRegisterMsgType(type, Handler(object, member), threadParam);
    }
    template <typename T, typename Member>
    void asyncRegisterEvtGroup(unsigned int group, T* object, Member member, unsigned int threadParam) {
        asyncRegisterEvtGroup(group, Handler(object, member), threadParam);
    }
    template <typename T, typename Member>
    void asyncCancelMsgType(unsigned int type, T* object, Member member, unsigned int threadParam) {
        asyncCancelMsgType(type, Handler(object, member), threadParam);
    }
    template <typename T, typename Member>
    void asyncCancelEvtGroup(unsigned int group, T* object, Member member, unsigned int threadParam) {
        asyncCancelEvtGroup(group, Handler(object, member), threadParam);
    }
    template <typename T, typename Member>
    void asyncUnregisteredMsgType(T* object, Member member, unsigned int threadParam) {
        asyncUnregisteredMsgType(Handler(object, member), threadParam);
    }
    template <typename T, typename Member>
    void asyncUnregisteredEvtGroup(T* object, Member member, unsigned int threadParam) {
        asyncUnregisteredEvtGroup(Handler(object, member), threadParam);
    }

    // Wait for one message or event, without limit if timeoutMs is 0. It is read into body unless that is
    // null, or returned to the caller, who owns it. Throw the waiter's Timeout.
    void asyncWaitMsg(unsigned int msgType, MsgBody* body, unsigned int timeoutMs);
    Msg* asyncWaitMsgMsg(unsigned int msgType, unsigned int timeoutMs);
    void asyncWaitEvtGroup(unsigned int group, MsgBody* body, unsigned int timeoutMs);
    Msg* asyncWaitEvtGroupMsg(unsigned int group, unsigned int timeoutMs);
    // Return a waiter that is already enabled. Destroy it before the object.
    std::unique_ptr<EvtCallback::MsgWait> getNewMsgWait(unsigned int msgType);
    std::unique_ptr<EvtCallback::EvtWait> getNewEvtWait(unsigned int group);

    // Writes "{TgtDesc: " address " HostDesc: " address, without a closing brace, because exceptions add
    // more.
    void toStream(std::ostream* out) const override;

  protected:
    // An object at another address, with the queue of `origin` and the time-outs that `origin` has now.
    Addressable(const CompDesc_t& target, const Addressable& origin);

    // Send a command and wait for the reply that its type names, or for an error if it has none. Read the
    // reply into `reply`, unless that is null. Without a `wait` they wait for the object's response time-out,
    // or its error wait time. Throw Timeout, UnexpectedMsg.
    template <typename Cmd>
    void command(Cmd&& cmd, typename std::remove_reference_t<Cmd>::Reply* reply, Wait wait = {}) {
        using Type = std::remove_reference_t<Cmd>;
        requestWithin(wait.value_or(responseTimeout_), Type::code, &cmd, Type::Reply::code, reply);
    }
    template <typename Cmd>
    void command(Cmd&& cmd,
                 Wait wait = {}) requires(!requires { typename std::remove_reference_t<Cmd>::Reply; }) {
        exchange(std::remove_reference_t<Cmd>::code, &cmd, 0, wait.value_or(errorWaitTime_), 0, 0);
    }

    MsgBody* superMsgBodyLookup(unsigned int msgType) { return Addressable::MsgBodyLookup(msgType); }
    MsgBody* superEvtBodyLookup(unsigned int evtType) { return Addressable::EvtBodyLookup(evtType); }

    // Ends the dispatcher and waits for its callbacks; the object makes no other from then on. The destructor
    // of every derived class calls it, because the dispatcher calls virtual functions of the object on other
    // threads, and callbacks use the whole object. If an object that has a dispatcher reaches the destructor
    // of a base class without the call, the process ends through a failed assertion.
    void endCallbacks();

  private:
    EvtCallback& dispatcher();  // makes the dispatcher when it is first called
    void requestWithin(unsigned int timeoutMs, unsigned int msgType, MsgBody* cmd, unsigned int retMsgType,
                       MsgBody* ret, unsigned int trans = 0, int flags = 0);
    Msg* exchange(unsigned int msgType, MsgBody* cmd, unsigned int retMsgType, unsigned int timeoutMs,
                  unsigned int trans, int flags);

    Attached<MsgQueue> queue_;  // destroyed after the dispatcher, which uses it
    CompDesc_t target_;
    unsigned int objId_;
    std::mutex callbackMade_;
    bool callbacksEnded_ = false;
    std::unique_ptr<EvtCallback> callback_;
    const std::type_info* whole_ = nullptr;  // the object's class when it made the dispatcher
    unsigned int responseTimeout_ = DefaultResponseTimeout;
    unsigned int errorWaitTime_ = DefaultErrorWaitTime;
};

}  // namespace vela

#endif
