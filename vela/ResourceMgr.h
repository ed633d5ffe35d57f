// A board's resource manager. It finds components and instances, allocates them, and keeps account of who
// uses them.
#ifndef VELA_RESOURCEMGR_H
#define VELA_RESOURCEMGR_H

#include "vela/ManagerMessages.h"
#include "vela/StdResource.h"

namespace vela {

struct ResourceMgrMessages : Family<ResourceMgrMessages>, ManagerMessages {
    // clang-format off
    struct CompAttrInfoResult_t : Body<8388614, rows::CompAttrInfoResult> { using Body::Body; };
    struct CompAttrInfo_t : Command<8388666, CompAttrInfoResult_t, rows::CompAttrInfo> { using Command::Command; };
    struct CompFind_t : Command<8388669, ComponentResult_t, rows::CompStartAttr> { using Command::Command; };
    struct CompInstAllocate_t : Command<8388670, ComponentResult_t, rows::CompInstAllocate> { using Command::Command; };
    struct CompInstFree_t : Command<8388673, ResultComplete_t, rows::DescOnly> { using Command::Command; };
    struct CompUse_t : Command<8388697, ResultComplete_t, rows::CompUse> { using Command::Command; };
    struct CompUnuse_t : Command<8388698, ResultComplete_t, rows::CompUnuse> { using Command::Command; };
    struct CompMultipleResult_t : Body<8388707, rows::CompMultipleResult> { using Body::Body; };
    struct CompFindAll_t : Command<8388706, CompMultipleResult_t, rows::CompFindAll> { using Command::Command; };
    // clang-format on

    using Bodies = BodyTable<ResultComplete_t, CompAttrInfoResult_t, ComponentResult_t, CompAttrInfo_t,
                             CompFind_t, CompInstAllocate_t, CompInstFree_t, CompUse_t, CompUnuse_t,
                             CompFindAll_t, CompMultipleResult_t>;
};

class ResourceMgr : public WithBodies<Addressable, ResourceMgrMessages> {
  public:
    using Found = staticList<CompMultipleResult_t::comps_t>;

    // The resource manager of the object's board. It uses the object's queue and time-outs.
    explicit ResourceMgr(const Addressable* object);
    explicit ResourceMgr(const Addressable& object) : ResourceMgr(&object) {}
    ~ResourceMgr() override { endCallbacks(); }

    // Commands, each with its fields; WithBodies::send sends a prepared one. All throw Timeout, and
    // UnexpectedMsg, also when nothing is found. StdResource.h describes what they have in common.

    // Finds the first component, from this processor and instance on, of this type (0: any) and attributes.
    StdResource find(unsigned char compType, unsigned char processor, unsigned short instance,
                     staticList<CompAttr_t> attributes, Wait wait = {});

    // Finds all components between two addresses that have these attributes. Sends as many commands as it
    // takes.
    Found findAll(CompDesc_t start, CompDesc_t end, staticList<CompAttr_t> attributes, Wait wait = {});
    // Finds all components of the board that have this type (0: any).
    Found findAll(unsigned char compType = 0, Wait wait = {});

    // Reads `count` attributes of a component, beginning with the one at `offset`.
    staticList<CompAttr_t> attributes(CompDesc_t component, unsigned int count, unsigned int offset,
                                      Wait wait = {});

    // Allocates an instance, which belongs to the caller, in a cluster.
    StdResource allocate(unsigned char compType, unsigned char processor, CompDesc_t cluster,
                         staticList<CompAttr_t> attributes, Wait wait = {});
    void free(CompDesc_t instance, Wait wait = {}) { command(CompInstFree_t(instance), nullptr, wait); }

    // Marks components as in use, each with a number of the caller's choice, or as no longer in use.
    void use(staticList<CompUse_t::List_t>& uses, Wait wait = {}) { command(CompUse_t(uses), nullptr, wait); }
    void use(const CompDesc_t& component, unsigned int payload, Wait wait = {});
    void unuse(staticList<CompUnuse_t::List_t>& uses, Wait wait = {}) {
        command(CompUnuse_t(uses), nullptr, wait);
    }
    void unuse(const CompDesc_t& component, Wait wait = {});

  private:
    CompDesc_t searchStart(unsigned char processor, unsigned short instance) const;
};

}  // namespace vela

#endif
