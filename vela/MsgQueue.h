// The object layer's handle on one host message queue: requests with replies, and the routing of everything
// else to the receiver registered for its source.
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

// Lives as long as an Addressable holds it. request() may be called from any thread.
class MsgQueue : public virtualObject, public Shared, public KSAsyncMsgReceiver {
  public:
    static constexpr unsigned int DefaultMaxRetMsgSize = 512;
    static inline unsigned int DefaultDepth = 5;  // of queues made without a depth of their own

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

    // Owns the message that came; its copies share it.
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

    // Owns the message from then on.
    using UnregisteredSource = void (*)(MsgQueue*, Msg*);

    // Opens the transport queue; a remote one asks for the address and the two sizes. Throws
    // KSResource_CreationError.
    MsgQueue(const CompDesc_t& hostDesc, unsigned int maxRetMsgSize, unsigned int depth);
    ~MsgQueue() override;

    CompDesc_t getHostDesc() const;

    // Sends cmd, which is consumed, and waits up to timeoutMs for the reply of its transaction; the caller
    // owns what is returned. Null when no reply came and none was expected (retMsgType 0). Throws Timeout,
    // ErrorMsg.
    Msg* request(Msg* cmd, unsigned int timeoutMs, unsigned int retMsgType, int flags = 0);

    // One receiver for each source; a second one throws Exception. The receiver is only looked at.
    void RegisterAsyncMsgReceiver(const CompDesc_t& source, AsyncMsgReceiver* receiver);
    // Returns once the receiver is no longer in use, except on the routing thread itself. Throws
    // OutOfBoundsError when there is none.
    void DeregisterAsyncMsgReceiver(const CompDesc_t& source);
    // The same for a receiver that may have been deregistered, or replaced, already.
    void withdraw(const CompDesc_t& source, const AsyncMsgReceiver* receiver);

    // What becomes of messages from sources that nobody registered for; by default they are reported on the
    // standard error stream and deleted, which is what null asks for again.
    void unregisteredSource(UnregisteredSource handler);

    // What happens when the connection to a board in another machine is lost for good: nothing by default,
    // which is what null asks for again. Called once, on the routing thread, or at once when it is lost
    // already.
    using ConnectionLost = void (*)(MsgQueue*);
    void connectionLost(ConnectionLost handler);

    void toStream(std::ostream* out) const override;  // "{HostDesc: " address "}"

  private:
    using Receivers = sharedKeyedList<CompDesc_t, AsyncMsgReceiver*>;

    // On the transport's reading thread, for every message that is no reply.
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

    Receivers receivers_;                    // its lock guards the next two as well
    AsyncMsgReceiver* receiving_ = nullptr;  // in use by the routing thread
    std::thread::id routingThread_;
    std::condition_variable_any receiverIdle_;

    // Last: its thread uses everything above, and is gone first.
    std::unique_ptr<KSMsgQueue> queue_;
};

}  // namespace vela

#endif
