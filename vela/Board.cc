#include "vela/Board.h"

namespace vela {

Board::Board(unsigned int board, MsgQueue* queue)
    : Addressable(CompDesc_t(0, static_cast<unsigned char>(board), 0, 0, 0), queue) {
    makeManagers();
}

void Board::makeManagers() {
    resourceMgr_ = std::make_unique<ResourceMgr>(this);
    clusterMgr_ = std::make_unique<ClusterMgr>(this);
}

void Board::MsgQueueAttach(MsgQueue* queue) {
    clusterMgr_.reset();
    resourceMgr_.reset();
    Addressable::MsgQueueAttach(queue);
    makeManagers();
}

MsgBody* Board::MsgBodyLookup(unsigned int msgType) {
    try {
        return clusterMgr_->MsgBodyLookup(msgType);
    } catch (const UndefinedMsgBody&) {
        return resourceMgr_->MsgBodyLookup(msgType);
    }
}

MsgBody* Board::EvtBodyLookup(unsigned int evtType) {
    try {
        return clusterMgr_->EvtBodyLookup(evtType);
    } catch (const UndefinedEvtBody&) {
        return resourceMgr_->EvtBodyLookup(evtType);
    }
}

Component Board::findComp(unsigned char compType, unsigned char processor) {
    return Component(resourceMgr_->find(compType, processor, 0, {}));
}

Instance Board::findInst(unsigned char compType, unsigned char processor, unsigned short instance) {
    return Instance(resourceMgr_->find(compType, processor, instance, {}));
}

}  // namespace vela
