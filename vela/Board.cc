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
    try {
        Addressable::MsgQueueAttach(queue);
    } catch (...) {  // the board stays on its old queue
        makeManagers();
        throw;
    }
    makeManagers();
}

// Looks into the tables of the families and does not use the managers: this function runs on other threads,
// while the managers may be made anew.
MsgBody* Board::MsgBodyLookup(unsigned int msgType) {
    if (MsgBody* const body = ClusterMgr::Bodies::make(msgType); body != nullptr)
        return body;
    if (MsgBody* const body = ResourceMgr::Bodies::make(msgType); body != nullptr)
        return body;
    return superMsgBodyLookup(msgType);
}

MsgBody* Board::EvtBodyLookup(unsigned int evtType) { return superEvtBodyLookup(evtType); }

void Board::setResponseTimeout(unsigned int ms) {
    Addressable::setResponseTimeout(ms);
    resourceMgr_->setResponseTimeout(ms);
    clusterMgr_->setResponseTimeout(ms);
}

void Board::setErrorWaitTime(unsigned int ms) {
    Addressable::setErrorWaitTime(ms);
    resourceMgr_->setErrorWaitTime(ms);
    clusterMgr_->setErrorWaitTime(ms);
}

Component Board::findComp(unsigned char compType, unsigned char processor) {
    return Component(resourceMgr_->find(compType, processor, 0, {}));
}

Instance Board::findInst(unsigned char compType, unsigned char processor, unsigned short instance) {
    return Instance(resourceMgr_->find(compType, processor, instance, {}));
}

}  // namespace vela
