// A host queue: where a host sends commands from and receives replies and events.
#ifndef HOSTSVC_KSMSGQUEUE_H
#define HOSTSVC_KSMSGQUEUE_H

#include <memory>
#include <mutex>

#include "hostsvc/KSAbstractMsgQueue.h"
#include "hostsvc/KSException.h"
#include "hostsvc/KSMsgRef.h"
#include "hostsvc/KSMutex.h"
#include "hostsvc/KSRunnable.h"
#include "hostsvc/KSThread.h"

// A clean-up routine. `slot` points to an NvMsg32Bit*; the routine frees the message, if there is one, and
// sets the pointer to null.
void* KSMsgQueueThread_Cleanup(void* slot);

// The base class of objects that receive messages. It is empty: a receiver derives from it, registers a
// pointer to this part of its object, and casts its member function to a member of this class.
class KSAsyncMsgReceiver {};

// The queue's reader thread reads every message from the transport. It gives the message to the request that
// waits for this reply; otherwise to the registered receiver; and if there is no receiver, it parks the
// message for a synchronous reader. A message has one owner at any time, who frees it. One request with a
// time-out may wait at a time.
class KSMsgQueue : private KSRunnable {
  public:
    class CreationError : public KSResource_CreationError {};
    using AsyncCallback = int (*)(KSMsgRef&);
    using AsyncMember = int (KSAsyncMsgReceiver::*)(KSMsgRef&);

    // A reply of this type answers a request of its transaction whatever reply type the request expects.
    static constexpr unsigned generalReply = 0x800001;

    // Opens the transport's queue and starts the reader thread. hostName is the machine with the board's
    // relay; null leaves the choice to the environment (KSTransportChoice.h). desc, a and b are only used for
    // a queue in another machine. Throws KSResource_CreationError.
    KSMsgQueue(NvCompDesc desc, unsigned a, unsigned b, const char* hostName);
    KSMsgQueue(const KSMsgQueue&) = delete;
    KSMsgQueue& operator=(const KSMsgQueue&) = delete;
    // Ends the reader thread, closes the transport's queue and frees the messages that nobody has taken. A
    // callback must not destroy its queue.
    virtual ~KSMsgQueue();

    NvCompDesc getHostDesc() const { return hostDesc_; }

    // Registers the receiver: from now on the reader thread calls its member for each message that is no
    // awaited reply. The receiver owns the message; the result of the member is ignored. Replaces the
    // receiver and the plain callback that were registered before. If a message is parked, this function
    // gives it to the receiver before it returns, on the calling thread. Only one thread may register at a
    // time.
    void registerAsyncCallback(void* receiver, AsyncMember callback);
    // Registers a plain callback. If there is also a receiver, the callback is called first and must neither
    // keep nor free the message; otherwise it owns the message.
    void registerAsyncCallback(AsyncCallback callback);

    // Registers a function that is called once when the connection to another machine is lost, on the reader
    // thread. From then on nothing arrives, and requests do not wait. If the connection is lost already, the
    // function is called at once, on the calling thread.
    void registerLost(void (*callback)(void*), void* argument);

    // Sends msg with this queue as its source. Takes the message over: the handle becomes empty. If timeoutMs
    // is not 0, waits for a reply with the same transaction and with replyType, type 0 or generalReply. The
    // reply must come from msg's target, unless anySource is not 0. Returns an empty handle when no reply
    // came in time. If timeoutMs is 0, returns a new message with an empty body at once. The caller frees the
    // returned message. Throws KSMsgRef::AllocationError.
    KSMsgRef request(KSMsgRef& msg, unsigned timeoutMs, unsigned replyType, int anySource);

    // The body of the reader thread. It does not return: it ends the thread when the thread is cancelled, or
    // throws KSRemoteService_ComFailure when the connection to another machine is lost.
    void readNroute(KSThread::control* control, char* arg);

  protected:
    // The parked message. A synchronous reader locks messageAvailable_, takes unclaimed_, and unlocks
    // slotFree_.
    NvMsg32Bit* unclaimed_ = nullptr;
    KSMutex messageAvailable_;  // locked while no message is parked
    KSMutex slotFree_;          // locked while a message is parked

  private:
    friend struct KSMsgQueueProbe;  // for tests: moments of a request that cannot be timed

    struct Expected {
        unsigned transaction;
        unsigned replyType;
        NvCompDesc source;
        bool anySource;

        bool matches(const KSMsgRef& msg) const;
    };

    struct Receivers {
        AsyncCallback plain = nullptr;
        KSAsyncMsgReceiver* object = nullptr;
        AsyncMember member = nullptr;

        bool none() const { return plain == nullptr && object == nullptr; }
        void deliver(NvMsg32Bit* msg) const;
    };

    // Called on the thread that makes the request.
    void expect(const Expected& reply);
    KSMsgRef takeReply();
    KSMsgRef giveUp();

    // Called on the reader thread only; install() and receivers() also on the thread that registers.
    void* readerBody(void* control, void* arg);
    std::uint32_t read(KSThread::control& control, NvMsg32Bit*& current);
    void route(KSThread::control& control, NvMsg32Bit*& msg);
    bool acceptReply(NvMsg32Bit*& msg, NvMsg32Bit*& late);
    void handOn(KSThread::control& control, NvMsg32Bit*& msg);
    bool park(NvMsg32Bit*& msg);

    void lose();

    NvMsg32Bit* install(const Receivers& next);
    Receivers receivers() const;

    KSThread reader_;
    std::unique_ptr<KSAbstractMsgQueue> transport_;
    NvCompDesc hostDesc_;

    mutable std::mutex guard_;  // guards all members below except replyLock_
    Receivers receivers_;
    Expected expected_{};
    bool waiting_ = false;
    NvMsg32Bit* reply_ = nullptr;
    bool lost_ = false;
    void (*lostCallback_)(void*) = nullptr;
    void* lostArgument_ = nullptr;
    KSMutex replyLock_;  // a signal: locked by the request that waits, unlocked by the reader thread with the
                         // reply
};

#endif
