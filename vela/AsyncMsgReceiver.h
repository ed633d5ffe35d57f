// The base class of objects that receive the unasked messages of one board-side object.
#ifndef VELA_ASYNCMSGRECEIVER_H
#define VELA_ASYNCMSGRECEIVER_H

#include "vela/CompDesc.h"
#include "vela/Msg.h"
#include "vela/virtualObject.h"

namespace vela {

class Addressable;
class MsgQueue;

// Registered with its owner's queue under the owner's target address, from the end of the most derived
// constructor (a message may come at once) to the beginning of its destructor.
class AsyncMsgReceiver : public virtualObject {
  public:
    explicit AsyncMsgReceiver(Addressable* owner) : owner_(owner) {}
    AsyncMsgReceiver(const AsyncMsgReceiver&) = delete;
    AsyncMsgReceiver& operator=(const AsyncMsgReceiver&) = delete;
    ~AsyncMsgReceiver() override;

    // Takes the message and owns it. Called on the queue's reader thread.
    virtual void receive(Msg* msg) = 0;

    Addressable* owner() const { return owner_; }

    // Register with the queue, and deregister. Each does nothing when that is so already. enrol throws
    // Exception when another receiver is registered for the address.
    void enrol();
    void leave();
    // Deregisters from its queue and registers with another. If that throws, as enrol does, it stays with the
    // old queue.
    void moveTo(MsgQueue* queue);

  private:
    Addressable* owner_;
    MsgQueue* queue_ = nullptr;  // the queue that it is registered with
    CompDesc_t source_;
};

}  // namespace vela

#endif
