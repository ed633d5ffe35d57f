#include "hostsvc/KSMsgQueue.h"

#include <pthread.h>

#include <iostream>
#include <string>
#include <utility>

#include "hostsvc/KSRemoteService_ComFailure.h"
#include "hostsvc/KSSleep.h"
#include "hostsvc/KSTransportChoice.h"

namespace {

constexpr unsigned pollMs = 10;
constexpr unsigned readerEndMs = 1000;

}  // namespace

void* KSMsgQueueThread_Cleanup(void* slot) {
    NvMsg32Bit*& msg = *static_cast<NvMsg32Bit**>(slot);
    if (msg != nullptr)
        nvMsgFree(std::exchange(msg, nullptr));
    return nullptr;
}

KSMsgQueue::KSMsgQueue(NvCompDesc desc, unsigned a, unsigned b, const char* hostName)
    : reader_(static_cast<KSRunnable*>(this),
              static_cast<void* (KSRunnable::*)(void*, void*)>(&KSMsgQueue::readerBody), 0),
      transport_(ks_openTransport(desc, a, b, hostName)),
      hostDesc_(transport_->getHostDesc()) {
    replyLock_.lock();
    messageAvailable_.lock();
    slotFree_.unlock();
    reader_.start(nullptr);
}

// Wakes the cancelled reader thread and waits for its end before the transport's queue is closed, so that the
// reader does not read a queue that is gone. If the reader does not end in time (no memory to wake it, or it
// is busy in a callback), the queue is closed first: closing wakes the reader too, and a cancelled reader
// does not read again.
KSMsgQueue::~KSMsgQueue() {
    reader_.cancel();
    transport_->wakeReader();
    reader_.tryJoin(readerEndMs, 1);
    transport_->close();
    reader_.join();
    KSMsgQueueThread_Cleanup(&reply_);
    KSMsgQueueThread_Cleanup(&unclaimed_);
}

void KSMsgQueue::registerAsyncCallback(void* receiver, AsyncMember callback) {
    Receivers next;
    next.object = static_cast<KSAsyncMsgReceiver*>(receiver);
    next.member = callback;
    while (NvMsg32Bit* const parked = install(next))
        next.deliver(parked);
}

void KSMsgQueue::registerAsyncCallback(AsyncCallback callback) {
    Receivers next = receivers();
    next.plain = callback;
    while (NvMsg32Bit* const parked = install(next))
        next.deliver(parked);
}

// If no message is parked, sets the receivers for the reader thread and returns null. Otherwise returns the
// parked message, which the caller gives to the receivers before it calls install() again. Until then the
// reader thread does not know the receivers, so it cannot call them at the same time or with a later message
// first.
NvMsg32Bit* KSMsgQueue::install(const Receivers& next) {
    const std::lock_guard lock(guard_);
    if (next.none() || !messageAvailable_.tryLock()) {
        receivers_ = next;
        return nullptr;
    }
    NvMsg32Bit* const parked = std::exchange(unclaimed_, nullptr);
    slotFree_.unlock();
    return parked;
}

KSMsgRef KSMsgQueue::request(KSMsgRef& msg, unsigned timeoutMs, unsigned replyType, int anySource) {
    msg.setSrcAddr(hostDesc_);
    if (timeoutMs != 0)
        expect({msg.getTrans(), replyType, msg.getTgtAddr(), anySource != 0});
    NvMsg32Bit* const sent = std::exchange(msg, KSMsgRef()).getMsgRef();
    if (transport_->msgWrite(sent) != 0)
        transport_->freeUnsent(sent);
    if (timeoutMs == 0)
        return KSMsgRef(0U);
    return replyLock_.tryLock(timeoutMs, pollMs) ? takeReply() : giveUp();
}

void KSMsgQueue::expect(const Expected& reply) {
    const std::lock_guard lock(guard_);
    expected_ = reply;
    replyLock_.tryLock();  // an earlier request may have left it locked or unlocked; now it is locked
    waiting_ = true;
    if (lost_)
        replyLock_.unlock();
}

KSMsgRef KSMsgQueue::takeReply() {
    const std::lock_guard lock(guard_);
    waiting_ = false;
    return KSMsgRef(std::exchange(reply_, nullptr));
}

// A reply that arrived between the last try and this call stays in reply_. The reader thread hands it on when
// a message arrives during the next request.
KSMsgRef KSMsgQueue::giveUp() {
    const std::lock_guard lock(guard_);
    waiting_ = false;
    return {};
}

// A lost connection ends the reader thread but not the program, because what has been received is still good.
// msgRead has reported every failure.
void* KSMsgQueue::readerBody(void* control, void* arg) {
    try {
        readNroute(static_cast<KSThread::control*>(control), static_cast<char*>(arg));
    } catch (const KSRemoteService_ComFailure& lost) {
        std::cerr << "The connection to the remote message queue on " + std::string(lost.hostName()) +
                         " is lost\n"
                  << std::flush;  // written in one piece, because other queues may report at the same time
        lose();
    }
    return nullptr;
}

// Notes that the connection is lost, wakes the request that waits for a reply, and calls the registered
// function.
void KSMsgQueue::lose() {
    void (*callback)(void*) = nullptr;
    {
        const std::lock_guard lock(guard_);
        lost_ = true;
        if (std::exchange(waiting_, false))
            replyLock_.unlock();
        callback = lostCallback_;
    }
    if (callback != nullptr)
        callback(lostArgument_);
}

void KSMsgQueue::registerLost(void (*callback)(void*), void* argument) {
    bool lost = false;
    {
        const std::lock_guard lock(guard_);
        lostCallback_ = callback;
        lostArgument_ = argument;
        lost = lost_;
    }
    if (lost)
        callback(argument);
}

void KSMsgQueue::readNroute(KSThread::control* control, char* /*arg*/) {
    pthread_setcanceltype(PTHREAD_CANCEL_DEFERRED, nullptr);
    NvMsg32Bit* current = nullptr;
    control->pushCleanup(KSMsgQueueThread_Cleanup, static_cast<void*>(&current));
    for (bool failed = false;;) {
        const bool wasFailing = failed;
        failed = read(*control, current) != 0;
        control->testCancel();
        if (!failed)
            route(*control, current);
        else if (wasFailing)
            ks_sleep_ms(pollMs);  // otherwise a transport that always fails would use up the processor
        control->testCancel();
    }
}

std::uint32_t KSMsgQueue::read(KSThread::control& control, NvMsg32Bit*& current) {
    try {
        return transport_->msgRead(&current);
    } catch (const KSRemoteService_ComFailure&) {
        control.popCleanup(1);  // `current` is about to go out of scope
        throw;
    }
}

void KSMsgQueue::route(KSThread::control& control, NvMsg32Bit*& msg) {
    if (msg == nullptr)
        return;
    NvMsg32Bit* late = nullptr;
    bool accepted = acceptReply(msg, late);
    if (late != nullptr) {
        control.pushCleanup(KSMsgQueueThread_Cleanup, static_cast<void*>(&late));
        handOn(control, late);
        control.popCleanup(0);
        accepted = acceptReply(msg, late);  // reply_ is empty now, and only this thread fills it
    }
    if (!accepted)
        handOn(control, msg);
}

// Gives msg to the request that waits, if it is the expected reply. If reply_ still holds the late reply to
// an earlier request, moves that to `late`, does not look at msg and returns false; the caller hands `late`
// on and calls again.
bool KSMsgQueue::acceptReply(NvMsg32Bit*& msg, NvMsg32Bit*& late) {
    const std::lock_guard lock(guard_);
    if (!waiting_)
        return false;
    late = std::exchange(reply_, nullptr);
    if (late != nullptr || !expected_.matches(KSMsgRef(msg)))
        return false;
    reply_ = std::exchange(msg, nullptr);
    waiting_ = false;
    replyLock_
        .unlock();  // under guard_: otherwise a request that begins now could take this signal for its own
    return true;
}

bool KSMsgQueue::Expected::matches(const KSMsgRef& msg) const {
    const unsigned type = msg.getMsgType();
    return msg.getTrans() == transaction && (type == 0 || type == generalReply || type == replyType) &&
           (anySource || descComp(msg.getSrcAddr(), source));
}

// Gives msg to the receivers, or parks it when there are none. Waits while there is no receiver and another
// message is parked. Takes msg over.
void KSMsgQueue::handOn(KSThread::control& control, NvMsg32Bit*& msg) {
    Receivers to = receivers();
    while (to.none()) {
        control.testCancel();
        if (slotFree_.tryLock(pollMs, pollMs) && park(msg))
            return;
        to = receivers();
    }
    to.deliver(std::exchange(msg, nullptr));
}

// Parks msg. The caller has locked slotFree_. If a receiver has been registered meanwhile, unlocks slotFree_,
// leaves msg with the caller and returns false.
bool KSMsgQueue::park(NvMsg32Bit*& msg) {
    const std::lock_guard lock(guard_);
    if (!receivers_.none()) {
        slotFree_.unlock();
        return false;
    }
    unclaimed_ = std::exchange(msg, nullptr);
    messageAvailable_.unlock();
    return true;
}

KSMsgQueue::Receivers KSMsgQueue::receivers() const {
    const std::lock_guard lock(guard_);
    return receivers_;
}

void KSMsgQueue::Receivers::deliver(NvMsg32Bit* msg) const {
    if (plain != nullptr) {
        KSMsgRef handle(msg);
        plain(handle);
    }
    if (object != nullptr) {
        KSMsgRef handle(msg);
        (object->*member)(handle);
    }
}
