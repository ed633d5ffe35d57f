#include "vela/MsgQueue.h"

#include <utility>

#include "vela/AsyncMsgReceiver.h"
#include "vela/StreamFlags.h"
#include "vela/report.h"

namespace vela {

namespace {

void reportUnregisteredSource(MsgQueue* queue, Msg* raw) {
    const std::unique_ptr<Msg> msg(raw);
    report(bannerBegin, joined("Unregisterd Source sent to MsgQueue ", *queue),
           joined("MsgType ", msg->getMsgType()), *msg,
           "You may specify your own handler for messages from unregistered sources using\n"
           "MsgQueue::unregisteredSource",
           bannerEnd);
}

// Makes a Msg of the message of a handle, which becomes empty. If there is no memory for the Msg, frees the
// message.
std::unique_ptr<Msg> adopt(KSMsgRef& ref) {
    try {
        return std::make_unique<Msg>(&ref);
    } catch (...) {
        if (ref.getMsgRef() != nullptr)
            ref.free();
        throw;
    }
}

}  // namespace

MsgQueue::MsgQueue(const CompDesc_t& hostDesc, unsigned int maxRetMsgSize, unsigned int depth)
    : unregisteredSource_(reportUnregisteredSource),
      queue_(std::make_unique<KSMsgQueue>(hostDesc.getNvCompDesc(), maxRetMsgSize, depth, nullptr)) {
    // The host services know the receiver only as a KSAsyncMsgReceiver.
    queue_->registerAsyncCallback(static_cast<KSAsyncMsgReceiver*>(this),
                                  static_cast<int (KSAsyncMsgReceiver::*)(KSMsgRef&)>(&MsgQueue::MsgRouter));
}

MsgQueue::~MsgQueue() = default;

CompDesc_t MsgQueue::getHostDesc() const { return CompDesc_t(queue_->getHostDesc()); }

Msg* MsgQueue::request(Msg* cmd, unsigned int timeoutMs, unsigned int retMsgType, int flags) {
    const std::unique_ptr<Msg> consumed(cmd);
    KSMsgRef sent(*consumed->getMsgRef());
    KSMsgRef reply;
    {
        std::unique_lock<Mutex> oneAtATime(requestMutex_, std::defer_lock);
        if (timeoutMs != 0)
            oneAtATime.lock();
        *consumed->getMsgRef() = KSMsgRef();  // the host services own the message now
        reply = queue_->request(sent, timeoutMs, retMsgType, flags);
    }
    std::unique_ptr<Msg> answer;
    if (reply.getMsgRef() != nullptr)
        answer = adopt(reply);
    // With time-out 0 the host services return an empty message that they have made, and never a reply.
    if (answer == nullptr || timeoutMs == 0) {
        if (retMsgType != 0)
            throw Timeout(this, retMsgType, timeoutMs);
        return nullptr;
    }
    if (answer->getMsgType() == 0 || answer->getMsgType() != retMsgType)
        throw ErrorMsg(this, std::move(answer));
    return answer.release();
}

void MsgQueue::RegisterAsyncMsgReceiver(const CompDesc_t& source, AsyncMsgReceiver* receiver) {
    const std::lock_guard guard(receivers_);
    if (receivers_.find(source) != nullptr)
        throw Exception(
            "Only One AsyncMsgReceiver can be registered for each source address on a particular MsgQueue");
    receivers_.set(source, receiver);
}

void MsgQueue::DeregisterAsyncMsgReceiver(const CompDesc_t& source) {
    std::unique_lock guard(receivers_);
    const AsyncMsgReceiver* const leaving = receivers_.element(source);
    receivers_.unset(source);
    awaitIdle(guard, leaving);
}

void MsgQueue::withdraw(const CompDesc_t& source, const AsyncMsgReceiver* receiver) {
    std::unique_lock guard(receivers_);
    AsyncMsgReceiver** const registered = receivers_.find(source);
    if (registered != nullptr && *registered == receiver)
        receivers_.unset(source);
    awaitIdle(guard, receiver);
}

// Waits until the reader thread does not use the receiver. On the reader thread itself it does not wait.
void MsgQueue::awaitIdle(std::unique_lock<Receivers>& guard, const AsyncMsgReceiver* receiver) {
    if (routingThread_ != std::this_thread::get_id())
        receiverIdle_.wait(guard, [&] { return receiving_ != receiver; });
}

void MsgQueue::unregisteredSource(UnregisteredSource handler) {
    unregisteredSource_ = handler == nullptr ? reportUnregisteredSource : handler;
}

void MsgQueue::connectionLost(ConnectionLost handler) {
    connectionLost_ = handler;
    queue_->registerLost(&MsgQueue::lost, this);
}

void MsgQueue::lost(void* queue) {
    auto* const self = static_cast<MsgQueue*>(queue);
    if (const ConnectionLost handler = self->connectionLost_; handler != nullptr)
        handler(self);
}

int MsgQueue::MsgRouter(KSMsgRef& ref) {
    try {
        route(adopt(ref));
    } catch (...) {
        // The receiver has reported the exception. The reader thread goes on with the next message.
    }
    return 1;
}

void MsgQueue::route(std::unique_ptr<Msg> msg) {
    AsyncMsgReceiver* const receiver = beginReceive(msg->getSrcAddr());
    if (receiver == nullptr) {
        routeUnregistered(std::move(msg));
        return;
    }
    struct Finally {
        MsgQueue& queue;
        ~Finally() { queue.endReceive(); }
    } const finally{*this};
    receiver->receive(msg.release());
}

void MsgQueue::routeUnregistered(std::unique_ptr<Msg> msg) {
    try {
        unregisteredSource_.load()(this, msg.release());
    } catch (const Exception& exception) {
        report("exception from the handler for unregistered sources", exception);
    } catch (...) {
        report("exception from the handler for unregistered sources");
    }
}

AsyncMsgReceiver* MsgQueue::beginReceive(const CompDesc_t& source) {
    const std::lock_guard guard(receivers_);
    AsyncMsgReceiver** const found = receivers_.find(source);
    receiving_ = found == nullptr ? nullptr : *found;
    routingThread_ = std::this_thread::get_id();
    return receiving_;
}

void MsgQueue::endReceive() {
    {
        const std::lock_guard guard(receivers_);
        receiving_ = nullptr;
    }
    receiverIdle_.notify_all();
}

void MsgQueue::toStream(std::ostream* out) const { *out << "{HostDesc: " << getHostDesc() << "}"; }

void MsgQueue::Timeout::toStream(std::ostream* out) const {
    const StreamFlags saved(*out);
    *out << "MsgQueue::Timeout" << std::hex << std::showbase << " MsgType: " << retMsgType_ << std::dec
         << " Timeout: " << timeoutMs_ << "ms)";
}

void MsgQueue::ErrorMsg::toStream(std::ostream* out) const {
    const StreamFlags saved(*out);
    *out << "MsgQueue::ErrorMsg "
         << "MsgBody: " << *msg_;
}

}  // namespace vela
