#include "hostsvc/KSMsgQueue.h"

#include <pthread.h>

#include <iostream>
#include <string>
#include <utility>

#include "hostsvc/KSRemoteService_ComFailure.h"
#include "hostsvc/KSSleep.h"
#include "hostsvc/KSTransportChoice.h"
#include "hostsvc/descComp.h"

namespace {

constexpr unsigned PollMs = 10;
constexpr unsigned ReaderEndMs = 1000;

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

// The reader is woken and seen off before the transport's queue goes, so that it is never about to read a
// queue that is gone. One that stays away (no memory to wake it, or busy in a callback) is waited for after
// that: closing the queue wakes it too, and a cancelled reader reads no more.
KSMsgQueue::~KSMsgQueue() {
    reader_.cancel();
    transport_->wakeReader();
    reader_.tryJoin(ReaderEndMs, 1);
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

// Lets the reader know the receivers, unless a message is parked: that one is returned for them, and the
// reader does not know them yet, so that it cannot call them at the same time or with a later message first.
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
    return replyLock_.tryLock(timeoutMs, PollMs) ? takeReply() : giveUp();
}

void KSMsgQueue::expect(const Expected& reply) {
    const std::lock_guard lock(guard_);
    expected_ = reply;
    replyLock_.tryLock();  // held now, whatever an earlier request left
    waiting_ = true;
    if (lost_)
        replyLock_.unlock();
}

KSMsgRef KSMsgQueue::takeReply() {
    const std::lock_guard lock(guard_);
    waiting_ = false;
    return KSMsgRef(std::exchange(reply_, nullptr));
}

// A reply that came since the last look stays: the reader hands it on when it meets it.
KSMsgRef KSMsgQueue::giveUp() {
    const std::lock_guard lock(guard_);
    waiting_ = false;
    return {};
}

// A connection that is lost ends the reader, not the program: what was received stays good. Every failure has
// been reported.
void* KSMsgQueue::readerBody(void* control, void* arg) {
    try {
        readNroute(static_cast<KSThread::control*>(control), static_cast<char*>(arg));
    } catch (const KSRemoteService_ComFailure& lost) {
        std::cerr << "The connection to the remote message queue on " + std::string(lost.hostName()) +
                         " is lost\n"
                  << std::flush;  // in one piece: other queues may say the same
        lose();
    }
    return nullptr;
}

// Whoever waits for a reply, waits no longer.
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
            ks_sleep_ms(PollMs);  // a transport that is gone must not take the processor with it
        control->testCancel();
    }
}

std::uint32_t KSMsgQueue::read(KSThread::control& control, NvMsg32Bit*& current) {
    try {
        return transport_->msgRead(&current);
    } catch (const KSRemoteService_ComFailure&) {
        control.popCleanup(1);  // while there still is what it cleans up
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
        accepted = acceptReply(msg, late);  // the slot is empty now: nobody else fills it
    }
    if (!accepted)
        handOn(control, msg);
}

// While a request waits, a reply in the slot is one that an earlier request gave up on: it is taken out into
// `late` and goes first, and msg is not looked at yet.
bool KSMsgQueue::acceptReply(NvMsg32Bit*& msg, NvMsg32Bit*& late) {
    const std::lock_guard lock(guard_);
    if (!waiting_)
        return false;
    late = std::exchange(reply_, nullptr);
    if (late != nullptr || !expected_.matches(KSMsgRef(msg)))
        return false;
    reply_ = std::exchange(msg, nullptr);
    waiting_ = false;
    replyLock_.unlock();  // still guarded, or a request that begins just now would take it for its own
    return true;
}

bool KSMsgQueue::Expected::matches(const KSMsgRef& msg) const {
    const unsigned type = msg.getMsgType();
    return msg.getTrans() == transaction && (type == 0 || type == GeneralReply || type == replyType) &&
           (anySource || descComp(msg.getSrcAddr(), source));
}

// Takes over msg. Waits while there is no receiver and the slot is taken; a receiver that is registered
// meanwhile gets the message.
void KSMsgQueue::handOn(KSThread::control& control, NvMsg32Bit*& msg) {
    Receivers to = receivers();
    while (to.none()) {
        control.testCancel();
        if (slotFree_.tryLock(PollMs, PollMs) && park(msg))
            return;
        to = receivers();
    }
    to.deliver(std::exchange(msg, nullptr));
}

// Fills the slot, which is the caller's; with a receiver there, gives it back and leaves msg alone.
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
