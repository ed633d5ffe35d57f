// A queue of the transport library in this machine.
#ifndef HOSTSVC_KSLOCALMSGQUEUE_H
#define HOSTSVC_KSLOCALMSGQUEUE_H

#include "hostsvc/KSAbstractMsgQueue.h"

class KSLocalMsgQueue : public KSAbstractMsgQueue {
  public:
    // Opens and binds a queue; the library chooses its address. The arguments are for queues in other
    // machines and are ignored. If opening or binding fails, raises the limit of open files by 60 and tries
    // once more. Throws KSResource_CreationError, and then leaves nothing open.
    KSLocalMsgQueue(NvCompDesc desc, unsigned a, unsigned b);
    ~KSLocalMsgQueue() override;

    std::uint32_t msgRead(NvMsg32Bit** out) override;
    std::uint32_t msgWrite(NvMsg32Bit* msg) override;
    // Sends an empty message to the queue itself, the first time it is called. If there is no memory for the
    // message, only close() wakes the reader.
    void wakeReader() override;
    // Ends the process through a failed assertion when the library does not unbind or close the queue.
    void close() override;

  private:
    std::uint32_t handle_;
    bool woken_ = false;
    bool closed_ = false;
};

#endif
