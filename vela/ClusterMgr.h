// A board's cluster manager.
#ifndef VELA_CLUSTERMGR_H
#define VELA_CLUSTERMGR_H

#include "vela/Addressable.h"
#include "vela/ManagerMessages.h"

namespace vela {

class ClusterMgr : public Addressable {
  public:
    using ComponentResult_t = Body<8388615, rows::DescOnly>;
    using ClusterResult_t = Body<8388652, rows::DescOnly>;
    using ClusterAllocate_t = Body<8388689, rows::CompStartAttr>;
    using ClusterFind_t = Body<8388691, rows::CompStartAttr>;

    using Bodies = BodyTable<ComponentResult_t, ClusterResult_t, ClusterAllocate_t, ClusterFind_t>;

    // The manager of the board that the object stands on, on the object's queue.
    explicit ClusterMgr(const Addressable* object)
        : Addressable(CompDesc_t(0, object->getTgtDesc().Board, 0, 0, 0), object->getMsgQueue()) {}
    ~ClusterMgr() override { endCallbacks(); }

    MsgBody* MsgBodyLookup(unsigned int msgType) override;
};

}  // namespace vela

#endif
