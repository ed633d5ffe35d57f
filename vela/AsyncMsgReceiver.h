// The base class of objects that receive the unasked messages of one board-side object.
#ifndef VELA_ASYNCMSGRECEIVER_H
#define VELA_ASYNCMSGRECEIVER_H

#include <utility>

#include "vela/CompDesc.h"
#include "vela/Msg.h"
#include "vela/virtualObject.h"

namespace vela {

class Addressable;
class MsgQueue;

// A receiver is registered with its owner's queue, under the owner's target address, from the end of the most
// derived constructor (a message may come at once) to the beginning of its destructor. The base class cannot
// do that, so a class derived from this one is abstract until it is made as an Enrolled (see below).
class AsyncMsgReceiver : public virtualObject {
  public:
    explicit AsyncMsgReceiver(Addressable* owner) : owner_(owner) {}
    AsyncMsgReceiver(const AsyncMsgReceiver&) = delete;
    AsyncMsgReceiver& operator=(const AsyncMsgReceiver&) = delete;
    ~AsyncMsgReceiver() override;

    // Takes the message and owns it. Called on the queue's reader thread.
    virtual void receive(Msg* msg) = 0;

    Addressable* owner() const { return owner_; }

    // Register with the owner's queue, and deregister. Neither does anything if that was done before. enrol
    // throws Exception when another receiver is registered for the address.
    void enrol();
    void leave();
    // Deregisters from its queue and registers with another. If that throws, as enrol does, it stays with the
    // old queue.
    void moveTo(MsgQueue* queue);

  private:
    // Overridden by a class whose constructor ends with enrol() and whose destructor begins with leave().
    virtual void enrolsItself() const = 0;

    Addressable* owner_;
    MsgQueue* queue_ = nullptr;  // the queue that it is registered with
    CompDesc_t source_;
};

// A receiver of the class, which is registered while it is whole:  Enrolled<Listener> listener(&object);
template <typename Receiver>
class Enrolled final : public Receiver {
  public:
    template <typename... Args>
    explicit Enrolled(Args&&... args) : Receiver(std::forward<Args>(args)...) {
        this->enrol();
    }
    ~Enrolled() override { this->leave(); }

  private:
    void enrolsItself() const override {}
};

}  // namespace vela

#endif
