// The interface of a queue of the board's message network, in this machine or in another.
#ifndef HOSTSVC_KSABSTRACTMSGQUEUE_H
#define HOSTSVC_KSABSTRACTMSGQUEUE_H

#include <cstdint>

#include "norv/norv.h"

// One thread reads; any thread may write. msgRead and msgWrite return a status of the transport library, 0
// for success.
class KSAbstractMsgQueue {
  public:
    KSAbstractMsgQueue() = default;
    KSAbstractMsgQueue(const KSAbstractMsgQueue&) = delete;
    KSAbstractMsgQueue& operator=(const KSAbstractMsgQueue&) = delete;

    // Waits for the next message and sets *out to it. The caller owns the message.
    virtual std::uint32_t msgRead(NvMsg32Bit** out) = 0;
    // Sends msg to its target address and becomes its owner. After a failure the caller passes msg to
    // freeUnsent.
    virtual std::uint32_t msgWrite(NvMsg32Bit* msg) = 0;

    // Closes the queue if it is open. No other thread may use it any more.
    virtual ~KSAbstractMsgQueue() = default;

    // Makes a thread that waits in msgRead return, so that it can end before the queue is destroyed.
    virtual void wakeReader() = 0;

    // Frees a message that msgWrite could not send, if msgWrite has left it to its caller. This class never
    // does.
    virtual void freeUnsent(NvMsg32Bit* /*msg*/) {}

    // Closes the queue. A thread that waits in msgRead returns, and from now on msgRead fails.
    virtual void close() = 0;

    // The address at which the queue receives. It is the source of every message that is sent through it.
    NvCompDesc getHostDesc() const { return hostDesc; }

  protected:
    NvCompDesc hostDesc{};
};

#endif
