// The host's mailbox on the board's message network.
#ifndef HOSTSVC_KSMSGQUEUE_H
#define HOSTSVC_KSMSGQUEUE_H

#include <memory>
#include <mutex>

#include "hostsvc/KSAbstractMsgQueue.h"
#include "hostsvc/KSAsyncMsgReceiver.h"
#include "hostsvc/KSException.h"
#include "hostsvc/KSMsgRef.h"
#include "hostsvc/KSMutex.h"
#include "hostsvc/KSRunnable.h"
#include "hostsvc/KSThread.h"

// A clean-up routine: frees the message that *slot, an NvMsg32Bit*, points at, and forgets it.
void* KSMsgQueueThread_Cleanup(void* slot);

// A reader thread takes every message off the transport's queue and gives it to the request that waits for
// exactly this reply, else to the asynchronous receiver, else parks it for a synchronous reader. Messages
// have one owner throughout, who frees them. One request with a time-out may be outstanding at a time.
class KSMsgQueue : private KSRunnable {
  public:
    class CreationError : public KSResource_CreationError {};
    using AsyncCallback = int (*)(KSMsgRef&);
    using AsyncMember = int (KSAsyncMsgReceiver::*)(KSMsgRef&);

    // Replies of this type answer any request of their transaction.
    static constexpr unsigned GeneralReply = 0x800001;

    // Opens the transport's queue and starts the reader. hostName is the machine to reach the board through;
    // null leaves the choice to the environment. desc, a and b matter to a queue in another machine alone.
    // Throws KSResource_CreationError.
    KSMsgQueue(NvCompDesc desc, unsigned a, unsigned b, const char* hostName);
    KSMsgQueue(const KSMsgQueue&) = delete;
    KSMsgQueue& operator=(const KSMsgQueue&) = delete;
    // Ends the reader, closes the transport's queue and frees what nobody has taken. Not from a callback.
    virtual ~KSMsgQueue();

    NvCompDesc getHostDesc() const { return hostDesc_; }

    // Whoever gets a message on the reader thread from now on. The receiver owns the message; the result is
    // ignored. The member replaces the plain callback and any receiver before it. A message that was parked
    // goes to the receiver first, before this returns and on the thread that calls. One thread registers at a
    // time.
    void registerAsyncCallback(void* receiver, AsyncMember callback);
    // Beside a receiver, a plain callback is called first and must leave the message alone.
    void registerAsyncCallback(AsyncCallback callback);

    // Called once, on the reader thread, when the connection to another machine is lost: nothing will arrive
    // any more, and requests are not waited for. At once and on the thread that calls when it is lost
    // already.
    void registerLost(void (*callback)(void*), void* argument);

    // Sends msg, which is taken over (the handle becomes empty), with this queue as its source. With a
    // time-out, waits for the reply of its transaction and of replyType (or 0, or GeneralReply), from msg's
    // target unless anySource is not 0: an empty handle when none came in time. Without one, returns a new
    // message with an empty body at once. The caller frees what is returned. Throws
    // KSMsgRef::AllocationError.
    KSMsgRef request(KSMsgRef& msg, unsigned timeoutMs, unsigned replyType, int anySource);

    // The reader thread's body. Does not return; ends the thread when it is cancelled. Throws
    // KSRemoteService_ComFailure when the connection to another machine is lost.
    void readNroute(KSThread::control* control, char* arg);

  protected:
    // For a synchronous reader: lock messageAvailable_, take unclaimed_, unlock slotFree_.
    NvMsg32Bit* unclaimed_ = nullptr;
    KSMutex messageAvailable_;  // held while unclaimed_ is empty
    KSMutex slotFree_;          // held while it is not

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

    // The requester's half.
    void expect(const Expected& reply);
    KSMsgRef takeReply();
    KSMsgRef giveUp();

    // The reader's half, on its thread alone.
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

    mutable std::mutex guard_;  // over all that follows, but not the reply lock
    Receivers receivers_;
    Expected expected_{};
    bool waiting_ = false;
    NvMsg32Bit* reply_ = nullptr;
    bool lost_ = false;
    void (*lostCallback_)(void*) = nullptr;
    void* lostArgument_ = nullptr;
    KSMutex replyLock_;  // held while there is no reply; the reader unlocks it
};

#endif
