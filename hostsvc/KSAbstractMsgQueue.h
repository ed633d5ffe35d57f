// A queue of the board's message network, here or in another machine.
#ifndef HOSTSVC_KSABSTRACTMSGQUEUE_H
#define HOSTSVC_KSABSTRACTMSGQUEUE_H

#include <cstdint>

#include "norv/norv.h"

// One thread reads; any thread may write. Both return a transport status.
class KSAbstractMsgQueue {
  public:
    KSAbstractMsgQueue() = default;
    KSAbstractMsgQueue(const KSAbstractMsgQueue&) = delete;
    KSAbstractMsgQueue& operator=(const KSAbstractMsgQueue&) = delete;

    // Waits for the next message; the caller owns it.
    virtual std::uint32_t msgRead(NvMsg32Bit** out) = 0;
    // Sends msg to its target address and takes it over; one that was not sent goes to freeUnsent.
    virtual std::uint32_t msgWrite(NvMsg32Bit* msg) = 0;

    // Closes the queue if close() has not. No thread may use it any more.
    virtual ~KSAbstractMsgQueue() = default;

    // Makes the reader's msgRead return, so that it can be seen off before the queue goes.
    virtual void wakeReader() = 0;

    // Frees what msgWrite has left to its caller: here, nothing.
    virtual void freeUnsent(NvMsg32Bit* /*msg*/) {}

    // Wakes the reader if wakeReader() has not, and closes the queue: from now on msgRead fails. A thread
    // that reads returns.
    virtual void close() = 0;

    // The address under which the queue receives: the source of every message sent through it.
    NvCompDesc getHostDesc() const { return hostDesc; }

  protected:
    NvCompDesc hostDesc{};
};

#endif
