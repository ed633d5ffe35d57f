#include "vela/Addressable.h"

#include <ostream>
#include <string>
#include <utility>

#include "hostsvc/KSSystem.h"
#include "vela/StreamFlags.h"
#include "vela/vela.h"

namespace vela {

namespace {

void printObject(std::ostream* out, const CompDesc_t& target, const CompDesc_t& host) {
    *out << "{TgtDesc: " << target << " HostDesc: " << host;
}

}  // namespace

Addressable::Addressable(const CompDesc_t& target, MsgQueue* queue)
    : target_(target), objId_(getUniqueObjId()) {
    Addressable::MsgQueueAttach(queue);
}

// The base has no state to copy.  NOLINTNEXTLINE(bugprone-copy-constructor-init)
Addressable::Addressable(const Addressable& other) : Addressable(other.target_, other) {}

Addressable::Addressable(const CompDesc_t& target, const Addressable& origin)
    : target_(target),
      objId_(getUniqueObjId()),
      responseTimeout_(origin.responseTimeout_),
      errorWaitTime_(origin.errorWaitTime_) {
    Addressable::MsgQueueAttach(origin.getMsgQueue());
}

Addressable::~Addressable() { endCallbacks(); }

// Callbacks that still run may use the dispatcher, so it is destroyed only after they have ended.
void Addressable::endCallbacks() {
    EvtCallback* ending = nullptr;
    {
        const std::lock_guard guard(callbackMade_);
        if (callback_ != nullptr && !callbacksEnded_ && typeid(*this) != *whole_)
            ks_assertionFailed((whole_->name() + std::string("'s destructor calls endCallbacks()")).c_str(),
                               "Addressable", __LINE__, __PRETTY_FUNCTION__);
        callbacksEnded_ = true;
        ending = callback_.get();
    }
    if (ending != nullptr)
        ending->end();
}

void Addressable::MsgQueueAttach(MsgQueue* queue) {
    if (queue == nullptr)
        queue = std::make_unique<MsgQueue>(target_, MsgQueue::DefaultMaxRetMsgSize, MsgQueue::DefaultDepth)
                    .release();
    Attached<MsgQueue> attached(queue);
    if (callback_ != nullptr)
        callback_->moveTo(queue);  // if this throws, the object stays on its old queue
    queue_ = std::move(attached);
}

MsgBody* Addressable::MsgBodyLookup(unsigned int msgType) { throw UndefinedMsgBody(msgType); }
MsgBody* Addressable::EvtBodyLookup(unsigned int evtType) { throw UndefinedEvtBody(evtType); }

void Addressable::request(unsigned int msgType, MsgBody* cmd, unsigned int retMsgType, MsgBody* ret,
                          unsigned int trans, int flags) {
    requestWithin(responseTimeout_, msgType, cmd, retMsgType, ret, trans, flags);
}

void Addressable::requestWithin(unsigned int timeoutMs, unsigned int msgType, MsgBody* cmd,
                                unsigned int retMsgType, MsgBody* ret, unsigned int trans, int flags) {
    const std::unique_ptr<Msg> reply(exchange(msgType, cmd, retMsgType, timeoutMs, trans, flags));
    if (ret != nullptr && reply != nullptr)
        reply->read(ret, 0);
}

void Addressable::request(unsigned int msgType, MsgBody* cmd, unsigned int trans, int flags) {
    exchange(msgType, cmd, 0, errorWaitTime_, trans, flags);
}

Msg* Addressable::exchange(unsigned int msgType, MsgBody* cmd, unsigned int retMsgType,
                           unsigned int timeoutMs, unsigned int trans, int flags) {
    auto msg = std::make_unique<Msg>(cmd->GetByteSize());
    msg->write(cmd, 0);
    if (trans == 0)
        trans = getUniqueTransId();
    msg->setTrans(trans);
    msg->setTgtAddr(target_);
    msg->setMsgType(msgType);
    try {
        return queue_->request(msg.release(), timeoutMs, retMsgType, flags);
    } catch (const MsgQueue::Timeout& timeout) {
        throw Timeout(*this, msgType, retMsgType, trans, timeout.timeoutMs());
    } catch (const MsgQueue::ErrorMsg& error) {
        throw UnexpectedMsg(*this, msgType, error.msg());
    }
}

EvtCallback& Addressable::dispatcher() {
    const std::lock_guard guard(callbackMade_);
    if (callback_ == nullptr && callbacksEnded_)
        throw Exception("the object is being destroyed");
    if (callback_ == nullptr) {
        whole_ = &typeid(*this);
        callback_ = std::make_unique<EvtCallback>(this);
    }
    return *callback_;
}

void Addressable::asyncRegisterMsgType(unsigned int type, const Handler& callback, unsigned int threadParam) {
    dispatcher().registerMsgType(type, callback, threadParam);
}

void Addressable::asyncRegisterEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam,
                                        std::shared_ptr<Lane> lane) {
    dispatcher().registerEvtGroup(group, callback, threadParam, std::move(lane));
}

void Addressable::asyncCancelMsgType(unsigned int type, const Handler& callback, unsigned int threadParam) {
    dispatcher().cancelMsgType(type, callback, threadParam);
}

void Addressable::asyncCancelMsgType(unsigned int type) { dispatcher().cancelMsgType(type); }

void Addressable::asyncCancelEvtGroup(unsigned int group, const Handler& callback, unsigned int threadParam) {
    dispatcher().cancelEvtGroup(group, callback, threadParam);
}

void Addressable::asyncCancelEvtGroup(unsigned int group) { dispatcher().cancelEvtGroup(group); }

void Addressable::asyncUnregisteredMsgType(const Handler& handler, unsigned int threadParam) {
    dispatcher().unregisteredMsgType(handler, threadParam);
}

void Addressable::asyncUnregisteredEvtGroup(const Handler& handler, unsigned int threadParam) {
    dispatcher().unregisteredEvtGroup(handler, threadParam);
}

void Addressable::asyncWaitMsg(unsigned int msgType, MsgBody* body, unsigned int timeoutMs) {
    getNewMsgWait(msgType)->wait(body, timeoutMs);
}

Msg* Addressable::asyncWaitMsgMsg(unsigned int msgType, unsigned int timeoutMs) {
    return getNewMsgWait(msgType)->waitMsg(timeoutMs);
}

void Addressable::asyncWaitEvtGroup(unsigned int group, MsgBody* body, unsigned int timeoutMs) {
    getNewEvtWait(group)->wait(body, timeoutMs);
}

Msg* Addressable::asyncWaitEvtGroupMsg(unsigned int group, unsigned int timeoutMs) {
    return getNewEvtWait(group)->waitMsg(timeoutMs);
}

std::unique_ptr<EvtCallback::MsgWait> Addressable::getNewMsgWait(unsigned int msgType) {
    auto waiter = std::make_unique<EvtCallback::MsgWait>(&dispatcher());
    waiter->enable(msgType);
    return waiter;
}

std::unique_ptr<EvtCallback::EvtWait> Addressable::getNewEvtWait(unsigned int group) {
    auto waiter = std::make_unique<EvtCallback::EvtWait>(&dispatcher());
    waiter->enable(group);
    return waiter;
}

void Addressable::toStream(std::ostream* out) const { printObject(out, target_, queue_->getHostDesc()); }

Addressable::Identity::Identity(const Addressable& object)
    : target(object.target_), host(object.queue_->getHostDesc()) {}

Addressable::Timeout::Timeout(const Addressable& object, unsigned int cmdMsgType, unsigned int retMsgType,
                              unsigned int trans, unsigned int timeoutMs)
    : object_(object),
      cmdMsgType_(cmdMsgType),
      retMsgType_(retMsgType),
      trans_(trans),
      timeoutMs_(timeoutMs) {}

void Addressable::Timeout::toStream(std::ostream* out) const {
    const StreamFlags saved(*out);
    *out << "Addressable::Timeout ObjSource: ";
    printObject(out, object_.target, object_.host);
    *out << std::hex << std::showbase << " CmdMsgType: " << cmdMsgType_ << " RetMsgType: " << retMsgType_
         << std::dec << " Trans: " << trans_ << " Timeout: " << timeoutMs_ << "ms";
}

Addressable::UnexpectedMsg::UnexpectedMsg(const Addressable& object, unsigned int cmdMsgType,
                                          std::shared_ptr<Msg> msg)
    : object_(object), cmdMsgType_(cmdMsgType), msg_(std::move(msg)) {}

void Addressable::UnexpectedMsg::toStream(std::ostream* out) const {
    const StreamFlags saved(*out);
    *out << std::hex << std::showbase << "Addressable::UnexpectedMsg ObjSource: ";
    printObject(out, object_.target, object_.host);
    *out << " CmdMsgType " << cmdMsgType_ << " RespMsg: " << *msg_;
}

}  // namespace vela
