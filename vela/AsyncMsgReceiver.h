// Receives what a board-side object sends unasked.
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

    // Owns the message. Called on the queue's routing thread.
    virtual void receive(Msg* msg) = 0;

    Addressable* owner() const { return owner_; }

    // Both do nothing when that is how things stand. enrol throws Exception when the address is taken.
    void enrol();
    void leave();
    // Leaves the queue it is registered with for another; stays there when that throws, as enrol does.
    void moveTo(MsgQueue* queue);

  private:
    Addressable* owner_;
    MsgQueue* queue_ = nullptr;  // where it is registered
    CompDesc_t source_;
};

}  // namespace vela

#endif
