// A host queue in the object layer. It sends requests and waits for their replies, and gives every other
// message to the receiver that is registered for the message's source.
#ifndef VELA_MSGQUEUE_H
#define VELA_MSGQUEUE_H

#include <atomic>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <thread>

#include "hostsvc/KSMsgQueue.h"
#include "vela/CompDesc.h"
#include "vela/Exception.h"
#include "vela/Msg.h"
#include "vela/Mutex.h"
#include "vela/Shared.h"
#include "vela/sharedKeyedList.h"

namespace vela {

class AsyncMsgReceiver;

// The queue is deleted when the last Addressable that has attached it detaches it. Any thread may call
// request().
class MsgQueue : public virtualObject, public Shared, public KSAsyncMsgReceiver {
  public:
    static constexpr unsigned int DefaultMaxRetMsgSize = 512;
    static inline unsigned int DefaultDepth = 5;  // for queues that an Addressable makes itself

    class Timeout : public Exception {
      public:
        Timeout(MsgQueue* queue, unsigned int retMsgType, unsigned int timeoutMs)
            : queue_(queue), retMsgType_(retMsgType), timeoutMs_(timeoutMs) {}
        MsgQueue* queue() const { return queue_; }
        unsigned int retMsgType() const { return retMsgType_; }
        unsigned int timeoutMs() const { return timeoutMs_; }
        void toStream(std::ostream* out) const override;

      private:
        MsgQueue* queue_;
        unsigned int retMsgType_;
        unsigned int timeoutMs_;
    };

    // The reply was an error or of another type. The exception owns the message; its copies share it.
    class ErrorMsg : public Exception {
      public:
        ErrorMsg(MsgQueue* queue, std::unique_ptr<Msg> msg) : queue_(queue), msg_(std::move(msg)) {}
        MsgQueue* queue() const { return queue_; }
        const std::shared_ptr<Msg>& msg() const { return msg_; }
        void toStream(std::ostream* out) const override;

      private:
        MsgQueue* queue_;
        std::shared_ptr<Msg> msg_;
    };

    // The function owns the message.
    using UnregisteredSource = void (*)(MsgQueue*, Msg*);

    // Opens the transport's queue. The arguments matter only for a queue in another machine. Throws
    // KSResource_CreationError.
    MsgQueue(const CompDesc_t& hostDesc, unsigned int maxRetMsgSize, unsigned int depth);
    ~MsgQueue() override;

    CompDesc_t getHostDesc() const;

    // Sends cmd, takes it over, and waits up to timeoutMs for the reply with its transaction, from cmd's
    // target or, if flags is not 0, from any source. The caller owns the returned message. Returns null when
    // no reply came and none was expected (retMsgType 0). Throws Timeout, ErrorMsg.
    Msg* request(Msg* cmd, unsigned int timeoutMs, unsigned int retMsgType, int flags = 0);

    // Registers the receiver for messages from this source. The queue does not own it. Throws Exception when
    // the source has a receiver already.
    void RegisterAsyncMsgReceiver(const CompDesc_t& source, AsyncMsgReceiver* receiver);
    // Deregisters the source's receiver, and waits until the reader thread does not use it any more; does not
    // wait on the reader thread itself. Throws OutOfBoundsError when the source has no receiver.
    void DeregisterAsyncMsgReceiver(const CompDesc_t& source);
    // The same, but does nothing if this receiver is not registered any more.
    void withdraw(const CompDesc_t& source, const AsyncMsgReceiver* receiver);

    // Sets the function for messages from sources without a receiver. By default, and with null, they are
    // reported on the standard error stream and deleted.
    void unregisteredSource(UnregisteredSource handler);

    // Sets the function that is called once when the connection to a board in another machine is lost for
    // good; with null none is called. It is called on the reader thread, or at once on the calling thread if
    // the connection is lost already.
    using ConnectionLost = void (*)(MsgQueue*);
    void connectionLost(ConnectionLost handler);

    void toStream(std::ostream* out) const override;  // "{HostDesc: " address "}"

  private:
    using Receivers = sharedKeyedList<CompDesc_t, AsyncMsgReceiver*>;

    // Called on the reader thread for every message that is no awaited reply.
    int MsgRouter(KSMsgRef& ref);
    void route(std::unique_ptr<Msg> msg);
    void routeUnregistered(std::unique_ptr<Msg> msg);
    void awaitIdle(std::unique_lock<Receivers>& guard, const AsyncMsgReceiver* receiver);
    AsyncMsgReceiver* beginReceive(const CompDesc_t& source);
    void endReceive();

    static void lost(void* queue);

    std::atomic<UnregisteredSource> unregisteredSource_;
    std::atomic<ConnectionLost> connectionLost_ = nullptr;
    Mutex requestMutex_;  // one request with a wait at a time

    Receivers receivers_;                    // its lock also guards the next two members
    AsyncMsgReceiver* receiving_ = nullptr;  // the receiver that the reader thread uses at the moment
    std::thread::id routingThread_;
    std::condition_variable_any receiverIdle_;

    // The last member, so that it is destroyed first: its thread uses all the others.
    std::unique_ptr<KSMsgQueue> queue_;
};

}  // namespace vela

#endif
