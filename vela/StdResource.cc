#include "vela/StdResource.h"

#include "vela/ResourceMgr.h"

namespace vela {

StdResource::StdResource(const CompDesc_t& target, MsgQueue* queue, int inUse) : StdResource(target, queue) {
    if (inUse != 0)
        StdResource::use(0);  // no derived object is there yet
}

void StdResource::use(unsigned int payload) { ResourceMgr(*this).use(getTgtDesc(), payload); }
void StdResource::unuse() { ResourceMgr(*this).unuse(getTgtDesc()); }
void StdResource::free() { ResourceMgr(*this).free(getTgtDesc()); }

void StdResource::DetectEvt(unsigned int evtType, unsigned int evtGroup, Addressable* returnTo, Wait wait) {
    CompDesc_t to = returnAddress(returnTo);
    command(MsgDetectEvt_t(to, evtType, evtGroup), nullptr, wait);
}

void StdResource::DetectxEvts(staticList<MsgDetectxEvts_t::List_t>& events, Addressable* returnTo,
                              Wait wait) {
    CompDesc_t to = returnAddress(returnTo);
    command(MsgDetectxEvts_t(to, events), nullptr, wait);
}

CompDesc_t StdResource::returnAddress(const Addressable* returnTo) const {
    return returnTo != nullptr ? returnTo->getTgtDesc() : getMsgQueue()->getHostDesc();
}

}  // namespace vela
