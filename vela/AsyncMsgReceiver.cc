#include "vela/AsyncMsgReceiver.h"

#include <utility>

#include "vela/Addressable.h"
#include "vela/MsgQueue.h"

namespace vela {

AsyncMsgReceiver::~AsyncMsgReceiver() { leave(); }

void AsyncMsgReceiver::enrol() {
    if (queue_ != nullptr)
        return;
    source_ = owner_->getTgtDesc();
    moveTo(owner_->getMsgQueue());
}

void AsyncMsgReceiver::leave() {
    if (MsgQueue* const queue = std::exchange(queue_, nullptr); queue != nullptr)
        queue->withdraw(source_, this);
}

void AsyncMsgReceiver::moveTo(MsgQueue* queue) {
    if (queue == queue_)
        return;
    queue->RegisterAsyncMsgReceiver(source_, this);
    leave();
    queue_ = queue;
}

}  // namespace vela
