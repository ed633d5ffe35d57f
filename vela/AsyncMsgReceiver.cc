#include "vela/AsyncMsgReceiver.h"

#include <utility>

#include "vela/Addressable.h"
#include "vela/MsgQueue.h"

namespace vela {

AsyncMsgReceiver::~AsyncMsgReceiver() { leave(); }

void AsyncMsgReceiver::enrol() {
    if (queue_ != nullptr)
        return;
    MsgQueue* const queue = owner_->getMsgQueue();
    source_ = owner_->getTgtDesc();
    queue->RegisterAsyncMsgReceiver(source_, this);
    queue_ = queue;
}

void AsyncMsgReceiver::leave() {
    if (MsgQueue* const queue = std::exchange(queue_, nullptr); queue != nullptr)
        queue->DeregisterAsyncMsgReceiver(source_);
}

}  // namespace vela
