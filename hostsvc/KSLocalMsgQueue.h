// A queue of the transport library on this machine.
#ifndef HOSTSVC_KSLOCALMSGQUEUE_H
#define HOSTSVC_KSLOCALMSGQUEUE_H

#include "hostsvc/KSAbstractMsgQueue.h"

class KSLocalMsgQueue : public KSAbstractMsgQueue {
  public:
    // The library gives the address; the arguments serve queues in other machines. Opening and binding are
    // tried once more with 60 more open files allowed. Throws KSResource_CreationError, and leaves nothing
    // open.
    KSLocalMsgQueue(NvCompDesc desc, unsigned a, unsigned b);
    ~KSLocalMsgQueue() override;

    std::uint32_t msgRead(NvMsg32Bit** out) override;
    std::uint32_t msgWrite(NvMsg32Bit* msg) override;
    // With an empty message to the queue itself, once. Without memory for one the closing itself has to do.
    void wakeReader() override;
    // Fails an assertion when the library does not give the queue back.
    void close() override;

  private:
    std::uint32_t handle_;
    bool woken_ = false;
    bool closed_ = false;
};

#endif
