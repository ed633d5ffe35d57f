// A board's resource manager: finds components and says who uses them.
#ifndef VELA_RESOURCEMGR_H
#define VELA_RESOURCEMGR_H

#include "vela/Body.h"
#include "vela/CompAttr.h"
#include "vela/ManagerMessages.h"
#include "vela/StdResource.h"

namespace vela {

class ResourceMgr : public Addressable {
  public:
    using ResultComplete_t = Body<8388608, NoFields>;
    using CompAttrInfoResult_t = Body<8388614, rows::CompAttrInfoResult>;
    using ComponentResult_t = Body<8388615, rows::DescOnly>;
    using CompAttrInfo_t = Body<8388666, rows::CompAttrInfo>;
    using CompFind_t = Body<8388669, rows::CompStartAttr>;
    using CompInstAllocate_t = Body<8388670, rows::CompInstAllocate>;
    using CompInstFree_t = Body<8388673, rows::DescOnly>;
    using CompUse_t = Body<8388697, rows::CompUse>;
    using CompUnuse_t = Body<8388698, rows::CompUnuse>;
    using CompFindAll_t = Body<8388706, rows::CompFindAll>;
    using CompMultipleResult_t = Body<8388707, rows::CompMultipleResult>;

    using Bodies = BodyTable<ResultComplete_t, CompAttrInfoResult_t, ComponentResult_t, CompAttrInfo_t,
                             CompFind_t, CompInstAllocate_t, CompInstFree_t, CompUse_t, CompUnuse_t,
                             CompFindAll_t, CompMultipleResult_t>;

    // The manager of the board that the object stands on, on the object's queue.
    explicit ResourceMgr(const Addressable* object);
    explicit ResourceMgr(const Addressable& object) : ResourceMgr(&object) {}
    ~ResourceMgr() override { endCallbacks(); }

    MsgBody* MsgBodyLookup(unsigned int msgType) override;

    // The first component that has the type (0: any) and the attributes. Throws Timeout, UnexpectedMsg.
    StdResource find(unsigned char compType, unsigned char processor, unsigned short instance,
                     const staticList<CompAttr_t>& attributes);

    void use(const CompDesc_t& component, unsigned int payload);
    void unuse(const CompDesc_t& component);
    void free(const CompDesc_t& instance);
};

}  // namespace vela

#endif
