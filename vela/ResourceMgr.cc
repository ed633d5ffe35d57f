#include "vela/ResourceMgr.h"

namespace vela {

namespace {

CompDesc_t managerOf(const CompDesc_t& any) { return {0, any.Board, 0, 0, 0}; }

}  // namespace

ResourceMgr::ResourceMgr(const Addressable* object)
    : Addressable(managerOf(object->getTgtDesc()), object->getMsgQueue()) {}

MsgBody* ResourceMgr::MsgBodyLookup(unsigned int msgType) {
    MsgBody* const body = Bodies::make(msgType);
    return body != nullptr ? body : superMsgBodyLookup(msgType);
}

StdResource ResourceMgr::find(unsigned char compType, unsigned char processor, unsigned short instance,
                              const staticList<CompAttr_t>& attributes) {
    const CompDesc_t own = getTgtDesc();
    CompFind_t cmd;
    cmd.CompStart = {instance, own.Board, processor, CompDesc_t::AnyComponent, own.Node};
    cmd.attr = attributes;
    if (compType != 0) {
        cmd.attr->realloc(attributes.length() + 1);
        cmd.attr->element(attributes.length()) = CompAttr_t(CompAttr_t::ComponentType, compType);
    }
    ComponentResult_t found;
    request(CompFind_t::code, &cmd, ComponentResult_t::code, &found);
    return StdResource(found.desc, getMsgQueue());
}

void ResourceMgr::use(const CompDesc_t& component, unsigned int payload) {
    CompUse_t cmd;
    cmd.List->realloc(1);
    cmd.List->element(0).desc = component;
    cmd.List->element(0).Payload = payload;
    request(CompUse_t::code, &cmd, ResultComplete_t::code, nullptr);
}

void ResourceMgr::unuse(const CompDesc_t& component) {
    CompUnuse_t cmd;
    cmd.List->realloc(1);
    cmd.List->element(0).desc = component;
    request(CompUnuse_t::code, &cmd, ResultComplete_t::code, nullptr);
}

void ResourceMgr::free(const CompDesc_t& instance) {
    CompInstFree_t cmd;
    cmd.desc = instance;
    request(CompInstFree_t::code, &cmd, ResultComplete_t::code, nullptr);
}

}  // namespace vela
